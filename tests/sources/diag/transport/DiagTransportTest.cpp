// The DIAG source through the velk transport interface, on capture files written here: the
// start-up commands answered, every decoded packet's events handed out in order as metric
// events, paced or as fast as taken, again with loop, and a clean end (a final frame cut short
// included) that the programs see through onEnd.
#include "sources/diag/DiagTransport.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <mutex>
#include <string>
#include <vector>

#include "baseband/velk/Names.h"
#include "core/Log.h"
#include "sources/Source.h"
#include "sources/diag/decode/ByteReader.h"
#include "tests/recordings/TempDir.h"
#include "tests/sources/diag/support/FakeDiagModem.h"
#include "tests/sources/diag/transport/WcdmaCapture.h"
#include "tests/sources/diag/umts/DecoderHarness.h"

namespace pyx::diag::test {
namespace {

using pyx::testing::TempDir;
namespace id = decode::id;

const std::string kConfigPath = std::string(PYXON_RESOURCE_DIR) + "/oru_test_lte.deviceconfig";

// What the programs' start-up sends: our application and the configuration text.
Value configurationInput() {
    std::ifstream file(kConfigPath, std::ios::binary);
    Bytes text{std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
    return Value(Dict{{velk::kKeyAppID, Value(std::int64_t{2})},
                      {velk::kKeyPayload, Value(std::move(text))},
                      {velk::kKeyPayloadType, Value(std::int64_t{0})}});
}

// What a transport hands out, and its end.
class Collector {
  public:
    velk::client::Transport::EventSink sink() {
        return [this](const std::string& stream, Value object) {
            const std::lock_guard lock(mutex_);
            streams_.push_back(stream);
            events_.push_back(std::move(object));
            changed_.notify_all();
        };
    }
    std::function<void(bool)> onEnd() {
        return [this](bool damaged) {
            const std::lock_guard lock(mutex_);
            ++ends_;
            damaged_ = damaged;
            changed_.notify_all();
        };
    }
    // Waits for the end (a bound far past any run, so a broken transport fails, not hangs).
    bool waitForEnd() {
        std::unique_lock lock(mutex_);
        return changed_.wait_for(lock, std::chrono::seconds(60), [&] { return ends_ > 0; });
    }
    bool waitForCount(std::size_t count) {
        std::unique_lock lock(mutex_);
        return changed_.wait_for(lock, std::chrono::seconds(60),
                                 [&] { return events_.size() >= count; });
    }
    // The PSC of every event handed out, in order ("?" for one not a WCDMA cell).
    std::vector<std::string> pscs() const {
        const std::lock_guard lock(mutex_);
        std::vector<std::string> out;
        for (const Value& event : events_) {
            const Value* metricID = event.asDict().find(velk::kKeyMetricID);
            const Value* payload = event.asDict().find(velk::kKeyPayload);
            if (!metricID || !payload || metricID->toInt64() != id::K_UMTS_SCELL_INFO) {
                out.emplace_back("?");
                continue;
            }
            const std::vector<MetricOut> one{{id::K_UMTS_SCELL_INFO, payload->asBytes()}};
            out.push_back(text(eventOf(one, id::K_UMTS_SCELL_INFO), "psc"));
        }
        return out;
    }
    std::vector<std::string> streams() const {
        const std::lock_guard lock(mutex_);
        return streams_;
    }
    int ends() const {
        const std::lock_guard lock(mutex_);
        return ends_;
    }
    bool damaged() const {
        const std::lock_guard lock(mutex_);
        return damaged_;
    }

  private:
    mutable std::mutex mutex_;
    std::condition_variable changed_;
    std::vector<std::string> streams_;
    std::vector<Value> events_;
    int ends_ = 0;
    bool damaged_ = false;
};

// Cells with PSC 1..count, their times spaced by gapMs (0: the modem's clock unset).
std::vector<CapturedCell> cells(std::uint32_t count, std::uint64_t gapMs) {
    std::vector<CapturedCell> out;
    const std::uint64_t start = 1700000000000ULL;
    for (std::uint32_t n = 1; n <= count; ++n)
        out.push_back({gapMs == 0 ? 0 : start + (n - 1) * gapMs, 10663, n});
    return out;
}

std::vector<std::string> numbered(std::uint32_t from, std::uint32_t to) {
    std::vector<std::string> out;
    for (std::uint32_t n = from; n <= to; ++n) out.push_back(std::to_string(n));
    return out;
}

DiagTransport::Options captureOptions(const std::string& file, double speed, Collector& collector) {
    DiagTransport::Options options;
    options.capture = file;
    options.speed = speed;
    options.onEnd = collector.onEnd();
    return options;
}

// Pushes a configuration as the start-up does, starts the events and waits for the capture's
// end; the events are stopped either way. False when the end did not come.
bool playToEnd(DiagTransport& transport, Collector& collector) {
    transport.performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr);
    transport.startEvents(collector.sink());
    const bool ended = collector.waitForEnd();
    transport.stopEvents();
    return ended;
}

TEST(DiagCapture, AtSpeedZeroEveryPacketsEventsComeInOrderAndTheCaptureEnds) {
    const CapturedLines faults(systemLogSink());
    const TempDir dir;
    const std::string file = dir.file("drive.qmdl");
    writeBytes(file, wcdmaCapture(cells(20, 200)));

    Collector collector;
    DiagTransport transport(captureOptions(file, 0, collector));
    EXPECT_TRUE(
        transport.performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr)
            .ok());
    transport.startEvents(collector.sink());
    ASSERT_TRUE(collector.waitForEnd());
    transport.stopEvents();

    EXPECT_EQ(collector.pscs(), numbered(1, 20));
    for (const std::string& stream : collector.streams()) EXPECT_EQ(stream, velk::kEventMetric);
    EXPECT_EQ(collector.ends(), 1);
    EXPECT_FALSE(collector.damaged());
    EXPECT_TRUE(transport.finished());
    EXPECT_TRUE(faults.contains(
        "diag " + file +
        ": end of the capture: 20 packets decoded, 0 not decoded, 0 bad frames; the screens "
        "keep the last values"))
        << ::testing::PrintToString(faults.lines());
}

TEST(DiagCapture, AtSpeedOneThePacketsComeInTheirOrder) {
    const TempDir dir;
    const std::string file = dir.file("drive.qmdl");
    writeBytes(file, wcdmaCapture(cells(4, 300)));

    Collector collector;
    DiagTransport transport(captureOptions(file, 1, collector));
    ASSERT_TRUE(playToEnd(transport, collector));
    EXPECT_EQ(collector.pscs(), numbered(1, 4));
}

// The store's backlog as the transport sees it: empty until `allowed` events were handed out,
// full after, so that the capture waits there.
class Store {
  public:
    explicit Store(const Collector& collector) : collector_(collector) {}
    std::function<std::size_t()> backlog() {
        return [this] {
            return collector_.pscs().size() < allowed.load() ? std::size_t{0} : std::size_t{100000};
        };
    }
    std::atomic<std::size_t> allowed{0};

  private:
    const Collector& collector_;
};

TEST(DiagCapture, WaitsForTheStoreAndARestartGoesOnWhereItStopped) {
    const CapturedLines faults(systemLogSink());
    const TempDir dir;
    const std::string file = dir.file("drive.qmdl");
    writeBytes(file, wcdmaCapture(cells(8, 100)));

    Collector collector;
    Store store(collector);
    store.allowed = 3;
    DiagTransport::Options options = captureOptions(file, 0, collector);
    options.backlog = store.backlog();
    DiagTransport transport(std::move(options));
    transport.performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr);
    transport.startEvents(collector.sink());
    ASSERT_TRUE(collector.waitForCount(3));
    transport.stopEvents();  // while it waits for the store
    EXPECT_EQ(collector.pscs(), numbered(1, 3));
    EXPECT_FALSE(transport.finished());
    EXPECT_TRUE(faults.contains(
        "diag " + file +
        ": stopped after 3 packets; read so far: 8 packets decoded, 0 not decoded, 0 "
        "bad frames"))
        << ::testing::PrintToString(faults.lines());

    store.allowed = 100;
    transport.startEvents(collector.sink());
    ASSERT_TRUE(collector.waitForEnd());
    transport.stopEvents();
    EXPECT_EQ(collector.pscs(), numbered(1, 8));
    EXPECT_EQ(collector.ends(), 1);
}

TEST(DiagCapture, PacketsWithoutTheModemsClockComeToo) {
    const TempDir dir;
    const std::string file = dir.file("noclock.bin");
    writeBytes(file, wcdmaCapture(cells(3, 0)));

    Collector collector;
    DiagTransport transport(captureOptions(file, 1, collector));
    ASSERT_TRUE(playToEnd(transport, collector));
    EXPECT_EQ(collector.pscs(), numbered(1, 3));
}

TEST(DiagCapture, LoopPlaysItAgainFromTheStartWithAFreshStream) {
    const CapturedLines faults(systemLogSink());
    const TempDir dir;
    const std::string file = dir.file("drive.qmdl");
    writeBytes(file, wcdmaCapture(cells(5, 100)));

    Collector collector;
    DiagTransport::Options options = captureOptions(file, 0, collector);
    options.loop = true;
    DiagTransport transport(std::move(options));
    transport.performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr);
    transport.startEvents(collector.sink());
    ASSERT_TRUE(collector.waitForCount(12));
    transport.stopEvents();

    const auto pscs = collector.pscs();
    ASSERT_GE(pscs.size(), 12U);
    const auto once = numbered(1, 5);
    for (std::size_t i = 0; i < pscs.size(); ++i) EXPECT_EQ(pscs[i], once[i % 5]) << i;
    EXPECT_EQ(collector.ends(), 0);
    EXPECT_FALSE(transport.finished());
    EXPECT_TRUE(faults.contains("diag " + file +
                                ": end of the capture: 5 packets decoded, 0 not decoded, 0 bad "
                                "frames; playing it again from the start (said once)"))
        << ::testing::PrintToString(faults.lines());
}

TEST(DiagCapture, AFinalFrameCutShortStillEndsCleanly) {
    const CapturedLines faults(systemLogSink());
    const TempDir dir;
    const std::string file = dir.file("cut.qmdl");
    Bytes bytes = wcdmaCapture(cells(3, 100));
    const Bytes last = wcdmaCapture(cells(4, 100));
    bytes.insert(bytes.end(), last.end() - 20, last.end() - 1);  // the 4th frame's end, no flag
    writeBytes(file, bytes);

    Collector collector;
    DiagTransport transport(captureOptions(file, 0, collector));
    ASSERT_TRUE(playToEnd(transport, collector));
    EXPECT_EQ(collector.pscs(), numbered(1, 3));
    EXPECT_FALSE(collector.damaged());
    EXPECT_GT(transport.stats().cutShort, 0U);
    bool said = false;
    for (const std::string& line : faults.lines())
        said = said || line.find("a final frame cut short") != std::string::npos;
    EXPECT_TRUE(said) << ::testing::PrintToString(faults.lines());
}

TEST(DiagCapture, NoiseAndABadFrameAreCountedAndSkipped) {
    const TempDir dir;
    const std::string file = dir.file("noisy.bin");
    Bytes bytes{0x01, 0x02, 0x03};  // the middle of a frame: the capture began there
    bytes.push_back(0x7E);
    const Bytes good = wcdmaCapture(cells(2, 100));
    bytes.insert(bytes.end(), good.begin(), good.end());
    Bytes bad = frame(logPacket(0x4127, logTimestamp(1700000001000ULL),
                                wcdmaCellPayload({1700000001000ULL, 10663, 9})));
    bad[20] ^= 0x01;  // its CRC no longer holds
    bytes.insert(bytes.end(), bad.begin(), bad.end());
    const Bytes more = wcdmaCapture(std::vector<CapturedCell>{{1700000002000ULL, 10663, 3}});
    bytes.insert(bytes.end(), more.begin(), more.end());
    writeBytes(file, bytes);

    Collector collector;
    DiagTransport transport(captureOptions(file, 0, collector));
    ASSERT_TRUE(playToEnd(transport, collector));
    EXPECT_EQ(collector.pscs(), numbered(1, 3));
    EXPECT_GE(packetCounts(transport.stats()).badFrames, 1U);
    EXPECT_EQ(packetCounts(transport.stats()).decoded, 3U);
}

TEST(DiagCapture, NothingFlowsBeforeAConfigurationIsAccepted) {
    const TempDir dir;
    const std::string file = dir.file("drive.qmdl");
    writeBytes(file, wcdmaCapture(cells(2, 100)));

    Collector collector;
    DiagTransport transport(captureOptions(file, 0, collector));
    transport.startEvents(collector.sink());
    transport.stopEvents();
    EXPECT_TRUE(collector.pscs().empty());
    EXPECT_EQ(collector.ends(), 0);
}

TEST(DiagCapture, AnswersTheStartUpCommandsAsTheModemSourceDoes) {
    const TempDir dir;
    const std::string file = dir.file("drive.qmdl");
    writeBytes(file, wcdmaCapture(cells(1, 100)));
    Collector collector;
    DiagTransport transport(captureOptions(file, 0, collector));

    const Value noApp(Dict{});
    EXPECT_EQ(transport.performCommand(velk::kCommandAddConfiguration, noApp, nullptr).code,
              velk::kCodeBadInput);
    EXPECT_TRUE(transport
                    .performCommand(velk::kCommandClearConfiguration,
                                    Value(Dict{{velk::kKeyAppID, Value(std::int64_t{2})}}), nullptr)
                    .ok());
    const velk::Result query =
        transport.performCommand(velk::kCommandQueryMetric,
                                 Value(Dict{{velk::kKeyAppID, Value(std::int64_t{2})},
                                            {velk::kKeyTriggerID, Value(std::int64_t{0x7F0013})},
                                            {velk::kKeyMetricID, Value(std::int64_t{0})}}),
                                 nullptr);
    EXPECT_EQ(query.code, velk::kCodeUnknownMetric);
    EXPECT_NE(query.message.find("answers no queries"), std::string::npos) << query.message;
    EXPECT_EQ(transport
                  .performCommand("Reboot", Value(Dict{{velk::kKeyAppID, Value(std::int64_t{2})}}),
                                  nullptr)
                  .code,
              velk::kCodeUnknownCommand);
}

TEST(DiagCapture, AMissingFileOrADirectoryIsOneLineNamingIt) {
    const TempDir dir;
    Collector collector;
    try {
        DiagTransport transport(captureOptions(dir.file("none.qmdl"), 0, collector));
        FAIL() << "accepted a missing capture";
    } catch (const DiagCaptureError& e) {
        EXPECT_NE(std::string(e.what()).find(dir.file("none.qmdl") + ": "), std::string::npos)
            << e.what();
    }
    try {
        DiagTransport transport(captureOptions(dir.path().string(), 0, collector));
        FAIL() << "accepted a directory";
    } catch (const DiagCaptureError& e) {
        EXPECT_EQ(std::string(e.what()), dir.path().string() + ": is a directory, not a capture");
    }
    EXPECT_THROW(DiagTransport(captureOptions(dir.file("x"), -1, collector)),
                 std::invalid_argument);
}

TEST(DiagCapture, ThroughTheSourceFactoryAsTheProgramsOpenIt) {
    const TempDir dir;
    const std::string file = dir.file("drive.qmdl");
    writeBytes(file, wcdmaCapture(cells(6, 100)));

    Collector collector;
    sources::SourceOptions options;
    options.choice = sources::parseSource("diag:" + file);
    EXPECT_TRUE(options.choice.capture);
    options.speed = 0;
    options.backlog = [] { return std::size_t{0}; };
    options.onEnd = collector.onEnd();
    const auto transport = sources::makeTransport(options);
    transport->performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr);
    transport->startEvents(collector.sink());
    ASSERT_TRUE(collector.waitForEnd());
    transport->stopEvents();
    EXPECT_EQ(collector.pscs(), numbered(1, 6));
}

// The lines a live link says, waited for.
class Lines {
  public:
    std::function<void(std::string_view)> sink() {
        return [this](std::string_view line) {
            const std::lock_guard lock(mutex_);
            lines_.emplace_back(line);
            changed_.notify_all();
        };
    }
    bool waitFor(const std::string& part) {
        std::unique_lock lock(mutex_);
        return changed_.wait_for(lock, std::chrono::seconds(60), [&] {
            for (const std::string& line : lines_)
                if (line.find(part) != std::string::npos) return true;
            return false;
        });
    }
    std::vector<std::string> all() const {
        const std::lock_guard lock(mutex_);
        return lines_;
    }

  private:
    mutable std::mutex mutex_;
    std::condition_variable changed_;
    std::vector<std::string> lines_;
};

TEST(DiagLive, TheFakeModemsPacketsComeAsEventsAndTheSummaryIsSaidAtStop) {
    const CapturedLines faults(systemLogSink());
    FakeDiagModem modem;
    Lines lines;
    DiagTransport::Options options;
    options.link.path = modem.path();
    options.link.onLine = lines.sink();
    DiagTransport transport(std::move(options));
    ASSERT_TRUE(
        transport.performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr)
            .ok());
    Collector collector;
    transport.startEvents(collector.sink());
    ASSERT_TRUE(lines.waitFor("DIAG logging on")) << ::testing::PrintToString(lines.all());
    for (std::uint32_t psc = 1; psc <= 3; ++psc) {
        const CapturedCell cell{1700000000000ULL + psc * 100, 10663, psc};
        modem.writePacket(logPacket(0x4127, logTimestamp(cell.timeMs), wcdmaCellPayload(cell)));
    }
    ASSERT_TRUE(collector.waitForCount(3));
    transport.stopEvents();
    EXPECT_EQ(collector.pscs(), numbered(1, 3));
    for (const std::string& stream : collector.streams()) EXPECT_EQ(stream, velk::kEventMetric);
    EXPECT_TRUE(faults.contains("diag " + modem.path() +
                                ": 3 packets decoded, 0 not decoded, 0 bad frames"))
        << ::testing::PrintToString(faults.lines());
}

TEST(DiagLive, TheQmdlKeptFromThePortPlaysBackAsACapture) {
    const TempDir dir;
    const std::string kept = dir.file("kept.qmdl");
    FakeDiagModem modem;
    {
        sources::SourceOptions options;
        options.choice = sources::parseSource("diag:" + modem.path());
        ASSERT_TRUE(sources::isLiveDiag(options.choice));
        options.qmdlFile = kept;
        const auto transport = sources::makeTransport(options);
        transport->performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr);
        Collector collector;
        transport->startEvents(collector.sink());
        ASSERT_TRUE(modem.waitForRequests(
            [](const std::vector<Bytes>& requests) { return requests.size() > 3; },
            std::chrono::seconds(60)));
        for (std::uint32_t psc = 7; psc <= 8; ++psc) {
            const CapturedCell cell{1700000000000ULL + psc * 100, 10663, psc};
            modem.writePacket(logPacket(0x4127, logTimestamp(cell.timeMs), wcdmaCellPayload(cell)));
        }
        ASSERT_TRUE(collector.waitForCount(2));
        transport->stopEvents();
        EXPECT_EQ(collector.pscs(), numbered(7, 8));
    }

    Collector collector;
    DiagTransport playback(captureOptions(kept, 0, collector));
    playback.performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr);
    playback.startEvents(collector.sink());
    ASSERT_TRUE(collector.waitForEnd());
    playback.stopEvents();
    EXPECT_EQ(collector.pscs(), numbered(7, 8));
}

}  // namespace
}  // namespace pyx::diag::test
