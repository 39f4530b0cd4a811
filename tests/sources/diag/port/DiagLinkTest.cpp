// The live link against a fake modem on a pseudo-terminal: the start-up commands and the masks
// the modem is given, packets streamed to the caller, the faults' lines (no answer, a refused
// mask, no port, permission, busy, gone and back), logging turned off at stop, and the .qmdl
// kept.
#include <fcntl.h>
#include <grp.h>
#include <poll.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <condition_variable>
#include <csignal>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "sources/diag/port/DiagLink.h"
#include "sources/diag/session/DiagCommands.h"
#include "sources/diag/stream/DiagStream.h"
#include "tests/sources/diag/support/FakeDiagModem.h"

namespace pyx::diag {
namespace {

namespace fs = std::filesystem;
using namespace std::chrono_literals;
using test::FakeDiagModem;

constexpr auto kDeadline = 5s;

// What the link said and handed on, waited for with a deadline.
class Seen {
  public:
    void line(std::string_view text) {
        const std::lock_guard lock(mutex_);
        lines_.emplace_back(text);
        changed_.notify_all();
    }
    void packet(const DecodedPacket& packet) {
        const std::lock_guard lock(mutex_);
        ++packets_;
        events_ += packet.events.size();
        changed_.notify_all();
    }

    // Waits for a line that contains part.
    bool waitForLine(const std::string& part, std::size_t times = 1) {
        std::unique_lock lock(mutex_);
        return changed_.wait_for(lock, kDeadline, [&] { return countLocked(part) >= times; });
    }
    bool waitForPackets(std::size_t count) {
        std::unique_lock lock(mutex_);
        return changed_.wait_for(lock, kDeadline, [&] { return packets_ >= count; });
    }
    std::size_t count(const std::string& part) {
        const std::lock_guard lock(mutex_);
        return countLocked(part);
    }
    std::vector<std::string> lines() {
        const std::lock_guard lock(mutex_);
        return lines_;
    }
    void end() {
        const std::lock_guard lock(mutex_);
        ended_ = true;
        changed_.notify_all();
    }
    // Waits for run() to return.
    bool waitForEnd() {
        std::unique_lock lock(mutex_);
        return changed_.wait_for(lock, kDeadline, [&] { return ended_; });
    }
    std::size_t events() {
        const std::lock_guard lock(mutex_);
        return events_;
    }

  private:
    std::size_t countLocked(const std::string& part) const {
        return static_cast<std::size_t>(
            std::count_if(lines_.begin(), lines_.end(),
                          [&](const std::string& l) { return l.find(part) != std::string::npos; }));
    }

    std::mutex mutex_;
    std::condition_variable changed_;
    std::vector<std::string> lines_;
    std::size_t packets_ = 0;
    std::size_t events_ = 0;
    bool ended_ = false;
};

std::string allLines(Seen& seen) {
    std::string text;
    for (const std::string& line : seen.lines()) text += "\n  " + line;
    return text;
}

// A link running on a thread of its own; stopped and joined when it goes.
class RunningLink {
  public:
    explicit RunningLink(DiagLink::Options options) : link_(withLines(std::move(options))) {
        thread_ = std::jthread([this](std::stop_token stop) {
            link_.run(stop, [this](DecodedPacket& packet) { seen.packet(packet); });
            seen.end();
        });
    }
    ~RunningLink() { stop(); }
    RunningLink(const RunningLink&) = delete;
    RunningLink& operator=(const RunningLink&) = delete;

    // Asks the link to stop and waits for run() to return.
    void stop() {
        if (!thread_.joinable()) return;
        thread_.request_stop();
        thread_.join();
    }
    // Asks the link to stop without waiting.
    void requestStop() { thread_.request_stop(); }
    [[nodiscard]] StreamStats stats() const { return link_.stats(); }

    Seen seen;

  private:
    DiagLink::Options withLines(DiagLink::Options options) {
        options.onLine = [this](std::string_view line) { seen.line(line); };
        return options;
    }

    DiagLink link_;
    std::jthread thread_;  // last: stopped before the rest goes
};

DiagLink::Options optionsFor(const std::string& path) {
    DiagLink::Options options;
    options.path = path;
    options.retryEvery = 50ms;
    return options;
}

// A folder of the test's own, removed with everything in it.
class TempFolder {
  public:
    TempFolder() {
        path_ = fs::temp_directory_path() /
                ("pyxon-diag-link-" + std::to_string(::getpid()) + "-" + std::to_string(++count_));
        fs::remove_all(path_);
        fs::create_directories(path_);
    }
    ~TempFolder() { fs::remove_all(path_); }
    TempFolder(const TempFolder&) = delete;
    TempFolder& operator=(const TempFolder&) = delete;
    [[nodiscard]] std::string file(const std::string& name) const {
        return (path_ / name).string();
    }

  private:
    fs::path path_;
    static inline int count_ = 0;
};

// Points link at target (replacing what it pointed at in one step).
void pointLink(const std::string& link, const std::string& target) {
    const std::string next = link + ".next";
    fs::remove(next);
    fs::create_symlink(target, next);
    fs::rename(next, link);
}

// Polls condition (for numbers that have nothing to wait on) until it holds or the deadline.
template <typename Condition>
bool eventually(Condition condition) {
    const auto deadline = std::chrono::steady_clock::now() + kDeadline;
    while (!condition()) {
        if (std::chrono::steady_clock::now() > deadline) return false;
        std::this_thread::sleep_for(10ms);
    }
    return true;
}

bool isSetMask(const Bytes& request) {
    const Bytes prefix = logConfigRequest(kLogConfigSetMask);
    return request.size() >= 16 && std::equal(prefix.begin(), prefix.end(), request.begin());
}

// What the masks should be: the decoders' codes that fit each equipment id's range.
std::map<std::uint32_t, Bytes> expectedMasks(const FakeDiagModem::Options& modem) {
    std::map<std::uint32_t, Bytes> masks;
    for (std::uint32_t id = 0; id < 16; ++id)
        if (modem.ranges[id] != 0) masks[id] = Bytes((modem.ranges[id] + 7) / 8, 0);
    for (const std::uint16_t code : DiagStream::decodedLogCodes()) {
        const std::uint32_t id = code >> 12;
        const std::uint32_t item = code & 0xFFF;
        if (modem.ranges[id] > item)
            masks[id][item / 8] |= static_cast<std::uint8_t>(1 << (item % 8));
    }
    return masks;
}

std::vector<std::uint16_t> codesBeyond(const FakeDiagModem::Options& modem) {
    std::vector<std::uint16_t> codes;
    for (const std::uint16_t code : DiagStream::decodedLogCodes())
        if (modem.ranges[code >> 12] <= (code & 0xFFFU)) codes.push_back(code);
    return codes;
}

Bytes cellIdPacket(std::uint32_t cellId) {
    return logPacket(0x4127, 0, test::wcdmaCellIdPayload(cellId));
}

// Log packets decoded and not, by (code, version).
std::map<std::pair<std::uint16_t, int>, std::pair<std::uint64_t, std::uint64_t>> decodedByKind(
    const StreamStats& stats) {
    std::map<std::pair<std::uint16_t, int>, std::pair<std::uint64_t, std::uint64_t>> kinds;
    for (const auto& [kind, counts] : stats.logs) kinds[kind] = {counts.decoded, counts.notDecoded};
    return kinds;
}

Bytes readFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

TEST(DiagLink, StartsWithVersionBuildIdRangesAndOneMaskPerEquipmentId) {
    const FakeDiagModem::Options modemOptions;
    FakeDiagModem modem(modemOptions);
    RunningLink link(optionsFor(modem.path()));
    ASSERT_TRUE(link.seen.waitForLine("DIAG logging on")) << allLines(link.seen);

    EXPECT_EQ(link.seen.count("DIAG modem on " + modem.path() +
                              ": sdx55.cp (compiled Nov  2 2021 22:13:12), build "
                              "RM500QGLABR11A06M4G"),
              1U)
        << allLines(link.seen);
    ASSERT_TRUE(modem.waitForRequest(eventReportRequest(true)));
    const std::vector<Bytes> requests = modem.requests();
    ASSERT_GE(requests.size(), 4U);
    EXPECT_EQ(requests[0], versionRequest());
    EXPECT_EQ(requests[1], buildIdRequest());
    EXPECT_EQ(requests[2], logConfigRequest(kLogConfigRetrieveRanges));
    // One SET_MASK per equipment id with items, then event reports on.
    const auto masks = expectedMasks(modemOptions);
    ASSERT_EQ(requests.size(), 3U + masks.size() + 1U);
    EXPECT_TRUE(std::all_of(requests.begin() + 3, requests.end() - 1, isSetMask));
    EXPECT_EQ(requests.back(), eventReportRequest(true));

    // Exactly the decoders' codes, with the modem's own item counts.
    const auto given = modem.masks();
    ASSERT_EQ(given.size(), masks.size());
    for (const auto& [id, bits] : masks) {
        ASSERT_TRUE(given.contains(id)) << "equipment id " << id;
        EXPECT_EQ(given.at(id).items, modemOptions.ranges[id]) << "equipment id " << id;
        EXPECT_EQ(given.at(id).bits, bits) << "equipment id " << id;
    }
    const auto beyond = codesBeyond(modemOptions);
    EXPECT_EQ(link.seen.count("the modem's log ranges leave out " + std::to_string(beyond.size()) +
                              " of the decoded log codes (" + codeList(beyond) + ")"),
              beyond.empty() ? 0U : 1U)
        << allLines(link.seen);
}

TEST(DiagLink, CodesBeyondTheModemsRangesAreLeftOutAndSaid) {
    FakeDiagModem::Options modemOptions;
    modemOptions.ranges[0xB] = 0xC1;  // LTE up to 0xB0C0 only
    modemOptions.ranges[0x5] = 0;     // no GSM logging at all
    FakeDiagModem modem(modemOptions);
    RunningLink link(optionsFor(modem.path()));
    ASSERT_TRUE(link.seen.waitForLine("DIAG logging on")) << allLines(link.seen);
    const auto beyond = codesBeyond(modemOptions);
    ASSERT_FALSE(beyond.empty());
    EXPECT_EQ(link.seen.count("the modem's log ranges leave out " + std::to_string(beyond.size()) +
                              " of the decoded log codes (" + codeList(beyond) +
                              "); its item counts: 0x1:4095 0x4:4087 0x6:28 0x7:2910 0x9:2070 "
                              "0xA:914 0xB:193 0xD:519"),
              1U)
        << allLines(link.seen);
    const std::size_t on = DiagStream::decodedLogCodes().size() - beyond.size();
    EXPECT_EQ(link.seen.count("DIAG logging on: " + std::to_string(on) + " log codes (" +
                              std::to_string(beyond.size()) + " left out) and event reports"),
              1U)
        << allLines(link.seen);
    const auto given = modem.masks();
    EXPECT_FALSE(given.contains(5));
    ASSERT_TRUE(given.contains(0xB));
    EXPECT_EQ(given.at(0xB).items, 0xC1U);
    EXPECT_EQ(given.at(0xB).bits, expectedMasks(modemOptions).at(0xB));
}

TEST(DiagLink, AModemWithoutBuildIdGoesOn) {
    FakeDiagModem::Options options;
    options.unanswered = {0x7C};
    FakeDiagModem modem(options);
    DiagLink::Options linkOptions = optionsFor(modem.path());
    linkOptions.commandTimeout = 100ms;
    RunningLink link(linkOptions);
    ASSERT_TRUE(link.seen.waitForLine("DIAG logging on")) << allLines(link.seen);
    EXPECT_EQ(link.seen.count("DIAG modem on " + modem.path() +
                              ": sdx55.cp (compiled Nov  2 2021 22:13:12), no build id"),
              1U)
        << allLines(link.seen);
}

TEST(DiagLink, AModemThatGivesNoLogRangesIsSaidOnce) {
    FakeDiagModem::Options options;
    options.unanswered = {0x73};
    FakeDiagModem modem(options);
    DiagLink::Options linkOptions = optionsFor(modem.path());
    linkOptions.commandTimeout = 100ms;
    RunningLink link(linkOptions);
    const std::string line = "no answer from " + modem.path() +
                             " to the log range request within 100 ms; trying again every 50 ms";
    ASSERT_TRUE(link.seen.waitForLine(line)) << allLines(link.seen);
    ASSERT_TRUE(modem.waitForRequests([](const std::vector<Bytes>& requests) {
        return std::count(requests.begin(), requests.end(), versionRequest()) >= 3;
    }));
    EXPECT_EQ(link.seen.count(line), 1U);
    EXPECT_EQ(link.seen.count("DIAG modem on " + modem.path()), 1U) << allLines(link.seen);
    EXPECT_EQ(link.seen.count("DIAG logging on"), 0U);
}

TEST(DiagLink, StopTurnsEventReportsAndLogMasksOff) {
    FakeDiagModem modem;
    RunningLink link(optionsFor(modem.path()));
    ASSERT_TRUE(modem.waitForRequest(eventReportRequest(true)));
    const std::size_t before = modem.requests().size();
    link.stop();
    const std::vector<Bytes> requests = modem.requests();
    ASSERT_EQ(requests.size(), before + 2);
    EXPECT_EQ(requests[before], eventReportRequest(false));
    EXPECT_EQ(requests[before + 1], logConfigRequest(kLogConfigDisable));
}

TEST(DiagLink, HandsOnDecodedPacketsAndGoesOnPastBadFrames) {
    FakeDiagModem modem;
    RunningLink link(optionsFor(modem.path()));
    ASSERT_TRUE(link.seen.waitForLine("DIAG logging on")) << allLines(link.seen);
    modem.writeBadCrc(cellIdPacket(0x00010001));
    modem.writePacket(cellIdPacket(0x00010002));
    modem.writePacket(multiSim(1, cellIdPacket(0x00010003)));
    ASSERT_TRUE(link.seen.waitForPackets(2));
    EXPECT_GT(link.seen.events(), 0U);
    // The numbers are published after each read is handed on.
    EXPECT_TRUE(eventually([&] { return link.stats().frames.badFrames == 1; }))
        << link.stats().frames.badFrames;
}

TEST(DiagLink, FramesBetweenARequestAndItsReplyGoToTheStream) {
    FakeDiagModem::Options options;
    // Before each reply: a log packet, a stray reply of a command never sent, a bad frame.
    appendFrame(cellIdPacket(0x00020001), options.beforeEachReply);
    appendFrame(Bytes{0x1D, 1, 2, 3, 4, 5, 6, 7, 8}, options.beforeEachReply);
    const Bytes bad = frame(Bytes{0x73, 0, 0, 0, 1, 0, 0, 0});
    options.beforeEachReply.insert(options.beforeEachReply.end(), bad.begin(), bad.end() - 3);
    options.beforeEachReply.insert(options.beforeEachReply.end(), {0x00, 0x00, 0x7E});
    FakeDiagModem modem(options);
    RunningLink link(optionsFor(modem.path()));
    ASSERT_TRUE(link.seen.waitForLine("DIAG logging on")) << allLines(link.seen);
    EXPECT_EQ(link.seen.count("DIAG modem on " + modem.path() + ": sdx55.cp"), 1U);
    EXPECT_EQ(link.seen.count("refused"), 0U) << allLines(link.seen);
    EXPECT_EQ(modem.masks().size(), expectedMasks(options).size());
    // The log packets pushed before the replies were decoded.
    EXPECT_TRUE(link.seen.waitForPackets(3));
}

TEST(DiagLink, AModemThatAnswersNothingIsSaidOnce) {
    FakeDiagModem::Options options;
    options.answers = false;
    FakeDiagModem modem(options);
    DiagLink::Options linkOptions = optionsFor(modem.path());
    linkOptions.commandTimeout = 100ms;
    RunningLink link(linkOptions);
    const std::string line = "no answer from " + modem.path() +
                             " to the version request within 100 ms: not a Qualcomm DIAG port?; "
                             "trying again every 50 ms";
    ASSERT_TRUE(link.seen.waitForLine(line)) << allLines(link.seen);
    // Tried again (three version requests), still said once.
    ASSERT_TRUE(modem.waitForRequests([](const std::vector<Bytes>& requests) {
        return std::count(requests.begin(), requests.end(), versionRequest()) >= 3;
    }));
    link.stop();
    EXPECT_EQ(link.seen.lines(), std::vector<std::string>{line});
    // Nothing was turned on, so nothing is turned off.
    const auto requests = modem.requests();
    EXPECT_TRUE(std::all_of(requests.begin(), requests.end(),
                            [](const Bytes& r) { return r == versionRequest(); }));
}

TEST(DiagLink, AStopEndsAWaitForAReplyAtOnce) {
    FakeDiagModem::Options options;
    options.answers = false;
    FakeDiagModem modem(options);
    DiagLink::Options linkOptions = optionsFor(modem.path());
    linkOptions.commandTimeout = std::chrono::minutes(10);
    RunningLink link(linkOptions);
    ASSERT_TRUE(modem.waitForRequest(versionRequest()));
    link.requestStop();
    EXPECT_TRUE(link.seen.waitForEnd());
    EXPECT_EQ(modem.requests(), std::vector<Bytes>{versionRequest()});
}

TEST(DiagLink, AStopEndsTheWaitForAPortAtOnce) {
    TempFolder folder;
    DiagLink::Options options = optionsFor(folder.file("diag"));
    options.retryEvery = std::chrono::minutes(10);
    RunningLink link(options);
    ASSERT_TRUE(link.seen.waitForLine("is not there")) << allLines(link.seen);
    link.requestStop();
    EXPECT_TRUE(link.seen.waitForEnd());
}

TEST(DiagLink, ARefusedMaskIsSaidAndTheOthersAreSet) {
    FakeDiagModem::Options options;
    options.refuseMasks = {4};
    options.badParameterMasks = {5};
    FakeDiagModem modem(options);
    RunningLink link(optionsFor(modem.path()));
    ASSERT_TRUE(link.seen.waitForLine("DIAG logging on")) << allLines(link.seen);
    EXPECT_EQ(link.seen.count("the modem refused the log mask of equipment id 0x4 (status 1); "
                              "going on with the other equipment ids"),
              1U)
        << allLines(link.seen);
    EXPECT_EQ(link.seen.count("the modem refused the log mask of equipment id 0x5 (error "
                              "reply 14); going on with the other equipment ids"),
              1U)
        << allLines(link.seen);
    auto masks = expectedMasks(options);
    masks.erase(4);
    masks.erase(5);
    const auto given = modem.masks();
    ASSERT_EQ(given.size(), masks.size());
    for (const auto& [id, bits] : masks) EXPECT_EQ(given.at(id).bits, bits) << id;
}

TEST(DiagLink, APortNotThereIsWaitedFor) {
    TempFolder folder;
    const std::string path = folder.file("diag");
    RunningLink link(optionsFor(path));
    const std::string line =
        "DIAG port " + path + " is not there; waiting for it to come back (looking every 50 ms)";
    ASSERT_TRUE(link.seen.waitForLine(line)) << allLines(link.seen);
    FakeDiagModem modem;
    pointLink(path, modem.path());
    ASSERT_TRUE(link.seen.waitForLine("DIAG logging on")) << allLines(link.seen);
    EXPECT_EQ(link.seen.count(line), 1U);
    EXPECT_EQ(link.seen.count("DIAG modem on " + path + ": sdx55.cp"), 1U);
}

TEST(DiagLink, APortGoneIsTakenUpAgainWhenItComesBack) {
    TempFolder folder;
    const std::string path = folder.file("diag");
    auto first = std::make_unique<FakeDiagModem>();
    pointLink(path, first->path());
    RunningLink link(optionsFor(path));
    ASSERT_TRUE(link.seen.waitForLine("DIAG logging on")) << allLines(link.seen);
    first->writePacket(cellIdPacket(0x00030001));
    ASSERT_TRUE(link.seen.waitForPackets(1));
    // Half a frame, then the modem goes.
    const Bytes half = frame(cellIdPacket(0x00030002));
    first->write(std::span(half).first(half.size() / 2));
    first->hangUp();
    const std::string gone = "DIAG port " + path +
                             " went away (unplugged, or the modem restarted); waiting for it to "
                             "come back (looking every 50 ms)";
    ASSERT_TRUE(link.seen.waitForLine(gone)) << allLines(link.seen);

    FakeDiagModem second;
    pointLink(path, second.path());
    ASSERT_TRUE(link.seen.waitForLine("DIAG logging on", 2)) << allLines(link.seen);
    EXPECT_EQ(second.requests().front(), versionRequest());
    EXPECT_EQ(second.masks().size(), first->masks().size());
    // The half frame is forgotten: the next packet decodes.
    second.writePacket(cellIdPacket(0x00030003));
    EXPECT_TRUE(link.seen.waitForPackets(2));
    EXPECT_EQ(link.seen.count(gone), 1U);
    EXPECT_EQ(link.seen.count("is not there"), 0U) << allLines(link.seen);
}

TEST(DiagLink, TheQmdlKeepsEveryByteTheModemWrote) {
    TempFolder folder;
    FakeDiagModem modem;
    DiagLink::Options options = optionsFor(modem.path());
    options.qmdlFile = folder.file("drive.qmdl");
    RunningLink link(options);
    ASSERT_TRUE(link.seen.waitForLine("DIAG logging on")) << allLines(link.seen);
    modem.writePacket(cellIdPacket(0x00040001));
    modem.writeBadCrc(cellIdPacket(0x00040002));
    modem.writePacket(multiSim(2, cellIdPacket(0x00040003)));
    modem.writePacket(
        eventReport(std::vector<WrittenEvent>{{.id = 1606, .timestamp = 0, .payload = {2}}}));
    const Bytes written = modem.written();
    ASSERT_TRUE(eventually([&] { return link.stats().frames.bytes >= written.size(); }));
    link.stop();  // the replies to logging off are kept too
    EXPECT_EQ(readFile(options.qmdlFile), modem.written());
    // It replays as the port read: the same packets decoded.
    DiagStream replay;
    std::size_t replayed = 0;
    const Bytes kept = readFile(options.qmdlFile);
    replay.feed(kept, [&](DecodedPacket&) { ++replayed; });
    EXPECT_GT(replayed, 0U);
    EXPECT_EQ(replay.stats().frames.badFrames, 1U);
    EXPECT_EQ(decodedByKind(replay.stats()), decodedByKind(link.stats()));
}

TEST(DiagLink, NoPortFoundListsTheSerialInterfacesSeen) {
    TempFolder folder;
    const fs::path interface = fs::path(folder.file("bus")) / "usb" / "devices" / "1-1:1.2";
    fs::create_directories(interface / "ttyUSB2");
    for (const auto& [name, value] : {std::pair{"bInterfaceClass", "ff"},
                                      {"bInterfaceSubClass", "00"},
                                      {"bInterfaceProtocol", "00"},
                                      {"bNumEndpoints", "02"}})
        std::ofstream(interface / name) << value << "\n";
    DiagLink::Options options = optionsFor("");
    options.sysfsRoot = folder.file("");
    RunningLink link(options);
    ASSERT_TRUE(link.seen.waitForLine(
        "no DIAG port found (USB serial interfaces seen: 1-1:1.2 ff/00/00, 2 endpoints, ttyUSB2); "
        "looking again every 50 ms"))
        << allLines(link.seen);
}

// The first line a link says about path when it runs as a user without rights (nobody), in a
// child process of its own (root may open anything); without root the test's own user is
// that user. Empty when nothing was said within the deadline.
std::string firstLineWithoutRights(const std::string& path) {
    int fds[2];
    if (::pipe2(fds, O_CLOEXEC) != 0) return "(no pipe)";
    const auto run = [&path](int out) {
        DiagLink::Options options = optionsFor(path);
        options.onLine = [out](std::string_view line) {
            [[maybe_unused]] const auto n = ::write(out, line.data(), line.size());
            ::_exit(0);
        };
        DiagLink link(options);
        const std::stop_source never;
        link.run(never.get_token(), {});
    };
    if (::geteuid() != 0) {
        std::stop_source stop;
        DiagLink::Options options = optionsFor(path);
        std::string first;
        options.onLine = [&](std::string_view line) {
            if (first.empty()) first = line;
            stop.request_stop();
        };
        DiagLink(options).run(stop.get_token(), {});
        ::close(fds[0]);
        ::close(fds[1]);
        return first;
    }
    const pid_t child = ::fork();
    if (child == 0) {
        ::close(fds[0]);
        ::alarm(10);
        if (::setgroups(0, nullptr) != 0 || ::setgid(65534) != 0 || ::setuid(65534) != 0)
            ::_exit(3);
        run(fds[1]);
        ::_exit(4);
    }
    ::close(fds[1]);
    std::string line;
    char buffer[512];
    pollfd p{fds[0], POLLIN, 0};
    while (::poll(&p, 1, static_cast<int>(std::chrono::milliseconds(kDeadline).count())) > 0) {
        const ssize_t n = ::read(fds[0], buffer, sizeof buffer);
        if (n <= 0) break;
        line.append(buffer, static_cast<std::size_t>(n));
    }
    ::close(fds[0]);
    ::kill(child, SIGKILL);
    int status = 0;
    ::waitpid(child, &status, 0);
    return line;
}

TEST(DiagLink, PermissionDeniedNamesTheGroupToJoin) {
    TempFolder folder;
    const std::string path = folder.file("ttyUSB0");
    { std::ofstream(path) << ""; }
    const group* dialout = ::getgrnam("dialout");
    if (dialout == nullptr) GTEST_SKIP() << "no group dialout on this system";
    if (::geteuid() == 0) {
        ASSERT_EQ(::chown(path.c_str(), 0, dialout->gr_gid), 0);
        ASSERT_EQ(::chmod(path.c_str(), 0660), 0);
        // The folder must let the other user reach the file.
        ASSERT_EQ(::chmod(fs::path(path).parent_path().c_str(), 0755), 0);
    } else {
        if (::chown(path.c_str(), ::geteuid(), dialout->gr_gid) != 0)
            GTEST_SKIP() << "cannot give a file to the group dialout as this user";
        ASSERT_EQ(::chmod(path.c_str(), 0), 0);
    }
    const std::string line = firstLineWithoutRights(path);
    if (line.empty() && ::geteuid() == 0)
        GTEST_SKIP() << "could not run a link as the user nobody (no setuid here?)";
    EXPECT_EQ(line, "permission denied opening DIAG port " + path +
                        ": join the group dialout (sudo usermod -aG dialout $USER) and log in "
                        "again; trying again every 50 ms");
}

TEST(DiagLink, APortTakenByAnotherProgramIsBusy) {
    FakeDiagModem modem;
    // Another program holds it exclusively (as ModemManager's probe does).
    const int other = ::open(modem.path().c_str(), O_RDWR | O_NOCTTY | O_CLOEXEC);
    ASSERT_GE(other, 0);
    ASSERT_EQ(::ioctl(other, TIOCEXCL), 0);
    if (::geteuid() == 0) {
        ASSERT_EQ(::chmod(modem.path().c_str(), 0666), 0);
    }
    const std::string line = firstLineWithoutRights(modem.path());
    ::close(other);
    if (line.empty() && ::geteuid() == 0)
        GTEST_SKIP() << "could not run a link as the user nobody (no setuid here?)";
    EXPECT_EQ(line, "DIAG port " + modem.path() +
                        " is busy: ModemManager probes it (or another DIAG tool has it open); "
                        "install the udev rule 70-pyxon-diag-mm-ignore.rules "
                        "(ENV{ID_MM_PORT_IGNORE}=\"1\", in Pyxon's doc examples) and restart "
                        "ModemManager; trying again every 50 ms");
}

}  // namespace
}  // namespace pyx::diag
