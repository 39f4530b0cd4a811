#include "sources/diag/DiagTransport.h"

#include <cerrno>
#include <chrono>
#include <cmath>
#include <cstring>
#include <filesystem>
#include <span>
#include <utility>

#include "baseband/velk/Names.h"
#include "core/Format.h"
#include "core/Log.h"
#include "core/PlaybackSpeed.h"
#include "sources/sim/BasebandCommands.h"

namespace pyx::diag {
namespace {

using Clock = std::chrono::steady_clock;

DiagTransport::Options checked(DiagTransport::Options options) {
    options.speed = checkedPlaybackSpeed(options.speed, "the capture's speed");
    if (options.chunkBytes == 0) options.chunkBytes = 64 * 1024;
    if (!options.link.onLine)
        options.link.onLine = [](std::string_view line) { systemFault(line); };
    return options;
}

std::ifstream openCapture(const std::string& path) {
    std::error_code error;
    const auto status = std::filesystem::status(path, error);
    if (error) throw DiagCaptureError(format("%s: %s", path.c_str(), error.message().c_str()));
    if (std::filesystem::is_directory(status))
        throw DiagCaptureError(format("%s: is a directory, not a capture", path.c_str()));
    std::ifstream file(path, std::ios::binary);
    if (!file)
        throw DiagCaptureError(
            format("%s: cannot be read (%s)", path.c_str(), std::strerror(errno)));
    return file;
}

std::string counted(std::uint64_t count, const char* one, const char* many) {
    return format("%llu %s", static_cast<unsigned long long>(count), count == 1 ? one : many);
}

void handOut(DecodedPacket& packet, const velk::client::Transport::EventSink& sink) {
    for (MetricOut& event : packet.events)
        sink(velk::kEventMetric, sim::metricEvent(event.metricID, std::move(event.payload)));
}

}  // namespace

PacketCounts packetCounts(const StreamStats& stats) {
    PacketCounts counts;
    for (const auto& [key, count] : stats.logs) {
        counts.decoded += count.decoded;
        counts.notDecoded += count.notDecoded;
    }
    for (const auto& [key, count] : stats.events) {
        counts.decoded += count.decoded;
        counts.notDecoded += count.notDecoded;
    }
    counts.notDecoded += stats.malformed;
    counts.badFrames = stats.frames.badFrames;
    return counts;
}

std::string summaryText(const StreamStats& stats) {
    const PacketCounts counts = packetCounts(stats);
    std::string text = counted(counts.decoded, "packet decoded", "packets decoded") + ", " +
                       counted(counts.notDecoded, "not decoded", "not decoded") + ", " +
                       counted(counts.badFrames, "bad frame", "bad frames");
    if (stats.cutShort > 0)
        text += ", a final frame cut short (" + counted(stats.cutShort, "byte", "bytes") + ")";
    return text;
}

DiagTransport::DiagTransport(Options options) : options_(checked(std::move(options))) {
    if (options_.capture.empty()) {
        link_ = std::make_unique<DiagLink>(options_.link);
    } else {
        rewind();
    }
}

DiagTransport::~DiagTransport() {
    const std::lock_guard control(controlMutex_);
    stopThread();
}

velk::Result DiagTransport::performCommand(const std::string& command, const Value& input,
                                           Value* output) {
    static_cast<void>(output);  // no command has a reply object
    auto checkedInput = sim::commandInput(input);
    if (auto* refused = std::get_if<velk::Result>(&checkedInput)) return std::move(*refused);
    const Dict& dict = *std::get<const Dict*>(checkedInput);

    if (command == velk::kCommandAddConfiguration) {
        auto parsed = sim::parseConfiguration(dict);
        if (auto* refused = std::get_if<velk::Result>(&parsed)) return std::move(*refused);
        {
            const std::lock_guard lock(mutex_);
            configured_ = true;
        }
        return velk::Result(velk::kCodeSuccess,
                            format("configuration accepted: %zu metrics; the DIAG source writes "
                                   "what the modem logs",
                                   std::get<sim::DeviceConfig>(parsed).metrics.size()));
    }
    if (command == velk::kCommandClearConfiguration)
        return velk::Result(velk::kCodeSuccess, "configuration cleared");
    if (command == velk::kCommandQueryMetric) {
        auto parsed = sim::parseQuery(dict);
        if (auto* refused = std::get_if<velk::Result>(&parsed)) return std::move(*refused);
        const std::int64_t asked = sim::answeringMetric(std::get<sim::MetricQuery>(parsed));
        return velk::Result(velk::kCodeUnknownMetric,
                            format("metric 0x%llX: the DIAG source answers no queries; it writes "
                                   "what the modem logs, as it logs it",
                                   static_cast<unsigned long long>(asked)));
    }
    return velk::Result(velk::kCodeUnknownCommand, format("unknown command '%s'", command.c_str()));
}

void DiagTransport::startEvents(EventSink sink) {
    const std::lock_guard control(controlMutex_);
    stopThread();
    {
        const std::lock_guard lock(mutex_);
        if (!configured_ && !started_) return;
        if (finished_) return;
        started_ = true;
    }
    thread_ = std::jthread([this, sink = std::move(sink)](const std::stop_token& stop) {
        if (link_) {
            runLink(stop, sink);
        } else {
            playCapture(stop, sink);
        }
    });
}

void DiagTransport::stopEvents() {
    const std::lock_guard control(controlMutex_);
    stopThread();
}

void DiagTransport::stopThread() {
    if (!thread_.joinable()) return;
    thread_.request_stop();
    thread_.join();
    // A capture stopped before its end: what it came to so far (the live link says its own).
    if (link_ || finished() || playback_.handedOut == 0) return;
    systemFault(format("diag %s: stopped after %s; read so far: %s", options_.capture.c_str(),
                       counted(playback_.handedOut, "packet", "packets").c_str(),
                       summaryText(stats()).c_str()));
}

bool DiagTransport::finished() const {
    const std::lock_guard lock(mutex_);
    return finished_;
}

StreamStats DiagTransport::stats() const {
    if (link_) return link_->stats();
    const std::lock_guard lock(mutex_);
    return lastStats_;
}

void DiagTransport::rewind() {
    playback_.file = openCapture(options_.capture);
    playback_.stream.emplace();
    playback_.ready.clear();
    playback_.next = 0;
    playback_.handedOut = 0;
    const std::lock_guard lock(mutex_);
    lastStats_ = playback_.stream->stats();
}

bool DiagTransport::waitUntil(const std::stop_token& stop, Clock::time_point due) {
    std::unique_lock lock(waitMutex_);
    return !wake_.wait_until(lock, stop, due, [] { return false; }) && !stop.stop_requested();
}

bool DiagTransport::waitForRoom(const std::stop_token& stop) {
    if (!options_.backlog) return !stop.stop_requested();
    // As a replay as fast as it is taken: a full backlog takes the store longer than 2 ms to
    // work through, so polling that often keeps it from running dry without spinning.
    while (options_.backlog() > options_.maxBacklog)
        if (!waitUntil(stop, Clock::now() + std::chrono::milliseconds(2))) return false;
    return !stop.stop_requested();
}

void DiagTransport::playCapture(const std::stop_token& stop, const EventSink& sink) {
    const bool timed = options_.speed > 0.0 && std::isfinite(options_.speed);
    // Timing starts afresh at every start and pass: the first timed packet is due at once.
    bool timing = false;  // whether firstMs and start hold a packet's time and its moment
    std::uint64_t firstMs = 0;
    Clock::time_point start;
    std::vector<std::uint8_t> chunk(options_.chunkBytes);
    Playback& playback = playback_;
    while (!stop.stop_requested()) {
        if (playback.next < playback.ready.size()) {
            DecodedPacket& packet = playback.ready[playback.next];
            if (timed && packet.modemTimeMs != 0) {
                if (!timing || packet.modemTimeMs < firstMs) {
                    timing = true;
                    firstMs = packet.modemTimeMs;
                    start = Clock::now();
                }
                const auto offset = std::chrono::duration<double, std::milli>(
                    static_cast<double>(packet.modemTimeMs - firstMs) / options_.speed);
                if (!waitUntil(stop, start + std::chrono::duration_cast<Clock::duration>(offset)))
                    return;
            }
            if (!waitForRoom(stop)) return;
            handOut(packet, sink);
            ++playback.next;
            ++playback.handedOut;
            continue;
        }
        playback.ready.clear();
        playback.next = 0;
        if (playback.file) {
            playback.file.read(reinterpret_cast<char*>(chunk.data()),
                               static_cast<std::streamsize>(chunk.size()));
            const auto got = static_cast<std::size_t>(playback.file.gcount());
            playback.stream->feed(std::span<const std::uint8_t>(chunk.data(), got),
                                  [&playback](DecodedPacket& packet) {
                                      playback.ready.push_back(std::move(packet));
                                  });
            const std::lock_guard lock(mutex_);
            lastStats_ = playback.stream->stats();
            if (!playback.file.bad()) continue;
        }
        // The end of this pass (a read error ends it where it broke off).
        const bool damaged = playback.file.bad();
        if (damaged)
            systemFault(format("diag %s: reading the capture failed; the capture stops here",
                               options_.capture.c_str()));
        playback.stream->finish();
        {
            const std::lock_guard lock(mutex_);
            lastStats_ = playback.stream->stats();
        }
        const bool again = options_.loop && !damaged && playback.handedOut > 0;
        endOfCapture(again, damaged);
        if (!again) return;
        try {
            rewind();
        } catch (const DiagCaptureError& e) {
            systemFault(format("diag %s; the capture stops here", e.what()));
            endOfCapture(false, true);
            return;
        }
        timing = false;
    }
}

void DiagTransport::endOfCapture(bool again, bool damaged) {
    bool sayEnd = false;
    bool callOnEnd = false;
    {
        const std::lock_guard lock(mutex_);
        sayEnd = !endSaid_;
        endSaid_ = true;
        if (!again && !finished_) {
            finished_ = true;
            callOnEnd = true;
        }
    }
    const std::string summary = summaryText(stats());
    if (sayEnd && !damaged) {
        if (again) {
            systemFault(
                format("diag %s: end of the capture: %s; playing it again from the start "
                       "(said once)",
                       options_.capture.c_str(), summary.c_str()));
        } else if (options_.loop) {
            systemFault(format("diag %s: end of the capture: %s; nothing in it to play again",
                               options_.capture.c_str(), summary.c_str()));
        } else {
            systemFault(format("diag %s: end of the capture: %s; the screens keep the last values",
                               options_.capture.c_str(), summary.c_str()));
        }
    }
    if (callOnEnd && options_.onEnd) options_.onEnd(damaged);
}

void DiagTransport::runLink(const std::stop_token& stop, const EventSink& sink) {
    link_->run(stop, [&sink](DecodedPacket& packet) { handOut(packet, sink); });
    const std::string port =
        options_.link.path.empty() ? "port (found by its USB interface)" : options_.link.path;
    systemFault(format("diag %s: %s", port.c_str(), summaryText(link_->stats()).c_str()));
}

}  // namespace pyx::diag
