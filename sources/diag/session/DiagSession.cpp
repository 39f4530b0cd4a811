#include "sources/diag/session/DiagSession.h"

#include <algorithm>

#include "sources/diag/frame/Hdlc.h"

namespace pyx::diag {

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::size_t kReadSize = std::size_t{64} * 1024;

std::string equipmentName(std::uint32_t id) {
    static constexpr char kDigits[] = "0123456789ABCDEF";
    return std::string("0x") + kDigits[id & 0xF];
}

std::string seconds(std::chrono::milliseconds timeout) {
    const auto ms = timeout.count();
    if (ms % 1000 == 0) return std::to_string(ms / 1000) + " s";
    return std::to_string(ms) + " ms";
}

void say(const std::function<void(std::string_view)>& to, const std::string& line) {
    if (to) to(line);
}

}  // namespace

DiagSession::DiagSession(DiagPort& port, DiagStream& stream, DiagStream::EventSink onEvents,
                         const StopSignal& stop, Options options)
    : port_(port),
      stream_(stream),
      onEvents_(std::move(onEvents)),
      stop_(stop),
      options_(std::move(options)),
      buffer_(kReadSize) {}

bool DiagSession::start() {
    started_ = {};
    spoke_ = false;
    const Reply version = command(versionRequest(), true);
    if (stop_.requested()) return false;
    if (!version)
        throw SessionError(SessionError::Kind::NoAnswer,
                           "no answer from " + port_.path() + " to the version request within " +
                               seconds(options_.commandTimeout) + ": not a Qualcomm DIAG port?");
    spoke_ = true;
    if (!errorReply(version.packet)) readVersion(version.packet, started_.identity);

    const Reply build = command(buildIdRequest(), true);
    if (stop_.requested()) return false;
    if (build && !errorReply(build.packet)) readBuildId(build.packet, started_.identity);
    say(options_.onNote, "DIAG modem on " + port_.path() + ": " + started_.identity.describe());

    const Bytes rangesRequest = logConfigRequest(kLogConfigRetrieveRanges);
    const Reply rangesReply = command(rangesRequest, true);
    if (stop_.requested()) return false;
    if (!rangesReply)
        throw SessionError(SessionError::Kind::NoAnswer, "no answer from " + port_.path() +
                                                             " to the log range request within " +
                                                             seconds(options_.commandTimeout));
    const auto status = logConfigStatus(rangesReply.packet);
    const auto ranges = logRanges(rangesReply.packet);
    if (errorReply(rangesReply.packet) || status != 0U || !ranges)
        throw SessionError(SessionError::Kind::Refused,
                           "the modem on " + port_.path() +
                               " does not give its log ranges, so no logging can be turned on");
    started_.ranges = *ranges;

    const std::span<const std::uint16_t> codes = DiagStream::decodedLogCodes();
    LogMaskPlan plan = planLogMasks(codes, started_.ranges);
    started_.leftOut = plan.leftOut;
    started_.codesOn = codes.size() - plan.leftOut.size();
    if (!plan.leftOut.empty()) {
        std::string line = "the modem's log ranges leave out " +
                           std::to_string(plan.leftOut.size()) + " of the decoded log codes (" +
                           codeList(plan.leftOut) + "); its item counts:";
        for (std::uint32_t id = 0; id < kEquipmentIds; ++id)
            if (started_.ranges[id] != 0)
                line += " " + equipmentName(id) + ":" + std::to_string(started_.ranges[id]);
        say(options_.onFault, line);
    }
    for (const EquipmentMask& mask : plan.masks) {
        setMask(mask);
        if (stop_.requested()) return false;
    }

    // The modem answers with the command byte of the event reports themselves, which the
    // stream takes as one (an empty report): nothing to wait for.
    send(eventReportRequest(true));
    say(options_.onNote,
        "DIAG logging on: " + std::to_string(started_.codesOn) + " log codes" +
            (plan.leftOut.empty() ? std::string()
                                  : " (" + std::to_string(plan.leftOut.size()) + " left out)") +
            " and event reports");
    return true;
}

void DiagSession::setMask(const EquipmentMask& mask) {
    const Reply reply = command(setMaskRequest(mask), true);
    if (stop_.requested()) return;
    const std::string which = "equipment id " + equipmentName(mask.equipmentId);
    std::string why;
    if (!reply)
        why = "no answer within " + seconds(options_.commandTimeout);
    else if (const auto error = errorReply(reply.packet))
        why = "error reply " + std::string(1, "0123456789ABCDEF"[*error >> 4]) +
              std::string(1, "0123456789ABCDEF"[*error & 0xF]);
    else if (const auto status = logConfigStatus(reply.packet); status != 0U)
        why = status ? "status " + std::to_string(*status) : "a reply too short";
    if (why.empty()) return;
    started_.refusedEquipmentIds.push_back(mask.equipmentId);
    say(options_.onFault, "the modem refused the log mask of " + which + " (" + why +
                              "); going on with the other equipment ids");
}

void DiagSession::pump(std::chrono::milliseconds upTo) {
    readOnce(upTo, stop_.fd());
    replies_.clear();  // nobody waits for them
}

void DiagSession::stop() {
    if (!spoke_) return;  // a port that never answered has nothing on
    try {
        send(eventReportRequest(false));
        command(logConfigRequest(kLogConfigDisable), false);
    } catch (const PortError&) {
        // Gone: nothing left to turn off.
    }
}

DiagSession::Reply DiagSession::command(const Bytes& request, bool wakeOnStop) {
    replies_.clear();
    send(request);
    const auto deadline = Clock::now() + options_.commandTimeout;
    for (;;) {
        while (!replies_.empty()) {
            Bytes reply = std::move(replies_.front());
            replies_.pop_front();
            if (answers(request, reply)) return {std::move(reply), true};
        }
        if (wakeOnStop && stop_.requested()) return {};
        const auto left =
            std::chrono::duration_cast<std::chrono::milliseconds>(deadline - Clock::now());
        if (left.count() <= 0) return {};
        readOnce(left, wakeOnStop ? stop_.fd() : -1);
    }
}

void DiagSession::send(const Bytes& request) {
    port_.write(frame(request), options_.commandTimeout);
}

void DiagSession::readOnce(std::chrono::milliseconds timeout, int wakeFd) {
    const std::size_t n = port_.read(buffer_, timeout, wakeFd);
    if (n == 0) return;
    const std::span<const std::uint8_t> bytes(buffer_.data(), n);
    if (options_.onBytes) options_.onBytes(bytes);
    stream_.feed(bytes, onEvents_, [this](std::span<const std::uint8_t> packet) {
        replies_.emplace_back(packet.begin(), packet.end());
    });
}

}  // namespace pyx::diag
