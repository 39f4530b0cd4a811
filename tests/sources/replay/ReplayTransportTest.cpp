#include "sources/replay/ReplayTransport.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <condition_variable>
#include <deque>
#include <filesystem>
#include <fstream>
#include <mutex>
#include <stdexcept>
#include <thread>

#include "baseband/EventRecord.h"
#include "baseband/VelkWrapper.h"
#include "core/Log.h"
#include "recordings/RecordingTransport.h"
#include "recordings/RecordingWriter.h"
#include "sources/Source.h"
#include "sources/sim/SimulatedBaseband.h"
#include "tests/baseband/RecordingDelegate.h"
#include "tests/recordings/SampleEvents.h"
#include "tests/recordings/TempDir.h"

namespace {

using pyx::Dict;
using pyx::Value;
using pyx::recordings::RecordingWriter;
using pyx::replay::ReplayTransport;
using pyx::testing::recordingOptions;
using pyx::testing::sampleEvent;
using pyx::testing::sequenceOf;
using pyx::testing::StreamEvent;
using pyx::testing::TempDir;

const std::string kConfigPath = std::string(PYXON_RESOURCE_DIR) + "/oru_test_lte.deviceconfig";

// A recording of the numbered sample events 0..count-1, spaced by gap.
void writeSamples(const std::string& file, int count,
                  std::chrono::milliseconds gap = std::chrono::milliseconds(0)) {
    RecordingWriter writer(recordingOptions(file));
    for (int n = 0; n < count; ++n) {
        if (n > 0 && gap.count() > 0) std::this_thread::sleep_for(gap);
        writer.add(velk::kEventMetric, sampleEvent(n));
    }
}

Value configurationInput() {
    return Value(Dict{{velk::kKeyAppID, Value(std::int64_t{2})}});
}

// Collects what a transport hands out.
class Collector {
  public:
    velk::client::Transport::EventSink sink() {
        return [this](const std::string& stream, Value object) {
            const std::lock_guard lock(mutex_);
            events_.push_back({stream, std::move(object)});
            changed_.notify_all();
        };
    }
    bool waitForCount(std::size_t count) {
        std::unique_lock lock(mutex_);
        return changed_.wait_for(lock, std::chrono::seconds(60),
                                 [&] { return events_.size() >= count; });
    }
    std::vector<StreamEvent> events() const {
        const std::lock_guard lock(mutex_);
        return events_;
    }

  private:
    mutable std::mutex mutex_;
    std::condition_variable changed_;
    std::vector<StreamEvent> events_;
};

bool waitUntil(const std::function<bool()>& done) {
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(60);
    while (!done()) {
        if (std::chrono::steady_clock::now() > deadline) return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    return true;
}

// Runs a client with a recording delegate over transport until done(delegate) holds.
std::vector<pyx::MetricRecord> deliveredThroughTheClient(
    const std::shared_ptr<velk::client::Transport>& transport, pyx::MainQueue& mainQueue,
    const std::function<bool(const pyx::testing::RecordingDelegate&)>& done) {
    velk::client::SetTransportFactory([transport] { return transport; });
    auto client = pyx::VelkWrapper::create(mainQueue);
    const auto delegate = std::make_shared<pyx::testing::RecordingDelegate>();
    client->setDelegate(delegate);
    EXPECT_TRUE(client->addTelxConfigForAppId("pyxtool", kConfigPath));
    client->listen();
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(60);
    while (!done(*delegate) && std::chrono::steady_clock::now() < deadline) {
        if (mainQueue.drain() == 0) std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    // What was handed out by then reaches the delegate.
    pyx::VelkWrapper::queue().waitIdle();
    mainQueue.drain();
    client.reset();  // the manager goes, and with it event delivery
    velk::client::SetTransportFactory(nullptr);
    pyx::VelkWrapper::queue().waitIdle();
    mainQueue.drain();
    std::vector<pyx::MetricRecord> records;
    for (const auto& call : delegate->metrics()) records.push_back(call.record);
    return records;
}

TEST(Replay, RecordThenReplayHandsTheStoreTheSameRecordsInTheSameOrder) {
    const pyx::CapturedLines log(pyx::systemLogSink());
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    pyx::MainQueue mainQueue;

    // Live: the simulated baseband, recorded on its way to the client.
    auto writer = std::make_shared<RecordingWriter>(recordingOptions(file));
    pyx::sim::SimulatedBaseband::Options simOptions;
    simOptions.seed = 11;
    simOptions.speed = 200.0;
    auto recorded = std::make_shared<pyx::recordings::RecordingTransport>(
        std::make_shared<pyx::sim::SimulatedBaseband>(simOptions), writer);
    const auto live = deliveredThroughTheClient(
        recorded, mainQueue, [](const auto& delegate) { return delegate.metrics().size() >= 400; });
    recorded.reset();
    writer->close();
    ASSERT_GE(live.size(), 400u);

    // What the file holds for the metric stream, as records.
    std::vector<pyx::MetricRecord> inFile;
    for (const auto& event : pyx::testing::readAll(file))
        if (event.stream == velk::kEventMetric)
            inFile.push_back(pyx::metricRecordFromEvent(event.object));
    ASSERT_GE(inFile.size(), live.size());
    // Everything the client got live is in the file, in order (the file may hold a few more
    // that were on their way when the client went).
    EXPECT_TRUE(std::equal(live.begin(), live.end(), inFile.begin()));

    // Replayed as fast as it is taken: the client gets exactly what the file holds.
    ReplayTransport::Options replayOptions;
    replayOptions.file = file;
    replayOptions.speed = 0;
    replayOptions.backlog = [&mainQueue] {
        return mainQueue.pending() + pyx::VelkWrapper::queue().pending();
    };
    const auto replay = std::make_shared<ReplayTransport>(replayOptions);
    const auto replayed = deliveredThroughTheClient(
        replay, mainQueue, [&](const auto&) { return replay->finished(); });
    ASSERT_EQ(replayed.size(), inFile.size());
    for (std::size_t i = 0; i < replayed.size(); ++i) ASSERT_EQ(replayed[i], inFile[i]) << i;
}

TEST(Replay, AsFastAsTakenNeverHandsOutMoreThanTheBacklogAllows) {
    const pyx::CapturedLines log(pyx::systemLogSink());
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    writeSamples(file, 3000);

    // A slow consumer: takes one event every 50 microseconds.
    std::mutex mutex;
    std::deque<Value> waiting;
    std::size_t most = 0;
    std::atomic<bool> done{false};
    std::vector<std::int64_t> taken;
    std::thread consumer([&] {
        while (!done || !waiting.empty()) {
            {
                const std::lock_guard lock(mutex);
                if (!waiting.empty()) {
                    taken.push_back(sequenceOf(waiting.front()));
                    waiting.pop_front();
                }
            }
            std::this_thread::sleep_for(std::chrono::microseconds(50));
        }
    });
    ReplayTransport::Options options;
    options.file = file;
    options.speed = 0;
    options.maxBacklog = 16;
    options.backlog = [&] {
        const std::lock_guard lock(mutex);
        return waiting.size();
    };
    ReplayTransport replay(options);
    replay.performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr);
    replay.startEvents([&](const std::string&, Value object) {
        const std::lock_guard lock(mutex);
        waiting.push_back(std::move(object));
        most = std::max(most, waiting.size());
    });
    ASSERT_TRUE(waitUntil([&] { return replay.finished(); }));
    done = true;
    consumer.join();
    EXPECT_LE(most, 17u);
    ASSERT_EQ(taken.size(), 3000u);
    for (std::size_t i = 0; i < taken.size(); ++i)
        ASSERT_EQ(taken[i], static_cast<std::int64_t>(i));
}

TEST(Replay, TheRecordedSpacingIsDividedByTheSpeed) {
    const pyx::CapturedLines log(pyx::systemLogSink());
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    writeSamples(file, 3, std::chrono::milliseconds(200));
    const auto spread = pyx::testing::readAll(file);
    const auto recordedNs = spread.back().monoNs - spread.front().monoNs;
    ASSERT_GE(recordedNs, 400'000'000);

    ReplayTransport::Options options;
    options.file = file;
    options.speed = 4;
    ReplayTransport replay(options);
    replay.performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr);
    Collector collector;
    const auto start = std::chrono::steady_clock::now();
    replay.startEvents(collector.sink());
    ASSERT_TRUE(collector.waitForCount(3));
    const auto took = std::chrono::steady_clock::now() - start;
    // Never sooner than the recorded spacing divided by the speed.
    EXPECT_GE(std::chrono::duration_cast<std::chrono::nanoseconds>(took).count(), recordedNs / 4);
}

TEST(Replay, AtTheEndItSaysSoOnceAndHandsOutNothingMore) {
    const pyx::CapturedLines log(pyx::systemLogSink());
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    writeSamples(file, 10);
    std::atomic<int> ends{0};
    ReplayTransport::Options options;
    options.file = file;
    options.speed = 0;
    options.onEnd = [&](bool damaged) {
        EXPECT_FALSE(damaged);
        ++ends;
    };
    ReplayTransport replay(options);
    replay.performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr);
    Collector collector;
    replay.startEvents(collector.sink());
    ASSERT_TRUE(waitUntil([&] { return replay.finished(); }));
    replay.startEvents(collector.sink());  // a restart at the end plays nothing again
    ASSERT_TRUE(waitUntil([&] { return replay.finished(); }));
    replay.stopEvents();
    EXPECT_EQ(collector.events().size(), 10u);
    EXPECT_EQ(ends, 1);
    const auto lines = log.lines();
    EXPECT_EQ(std::count(lines.begin(), lines.end(),
                         "replay " + file +
                             ": end of the recording after 10 events; the screens keep the last "
                             "values"),
              1);
}

TEST(Replay, TheRecordedPositionsComeAtTheirTimesAmongTheEvents) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    {
        RecordingWriter writer(recordingOptions(file));
        int fixes = 0;
        for (int n = 0; n < 10; ++n) {
            writer.add(velk::kEventMetric, sampleEvent(n));
            if (n == 2 || n == 6) {
                // Arrival times a little apart from the events' on either side.
                std::this_thread::sleep_for(std::chrono::milliseconds(3));
                pyx::gps::Fix fix;
                fix.receivedNs = std::chrono::duration_cast<std::chrono::nanoseconds>(
                                     std::chrono::system_clock::now().time_since_epoch())
                                     .count();
                fix.timeNs = fix.receivedNs;
                fix.mode = pyx::gps::FixMode::ThreeD;
                fix.lat = 48.0 + fixes++;
                writer.addFix(fix);
                std::this_thread::sleep_for(std::chrono::milliseconds(3));
            }
        }
    }
    std::mutex mutex;
    std::vector<std::string> order;
    ReplayTransport::Options options;
    options.file = file;
    options.speed = 0;
    options.onFix = [&](const pyx::gps::Fix& fix) {
        const std::lock_guard lock(mutex);
        order.push_back("fix " + std::to_string(static_cast<int>(fix.lat)));
    };
    ReplayTransport replay(options);
    replay.performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr);
    replay.startEvents([&](const std::string&, Value object) {
        const std::lock_guard lock(mutex);
        order.push_back(std::to_string(sequenceOf(object)));
    });
    ASSERT_TRUE(waitUntil([&] { return replay.finished(); }));
    replay.stopEvents();
    const std::lock_guard lock(mutex);
    EXPECT_EQ(order, (std::vector<std::string>{"0", "1", "2", "fix 48", "3", "4", "5", "6",
                                               "fix 49", "7", "8", "9"}));
}

TEST(Replay, WithLoopItStartsAgainFromTheFirstEventAndSaysTheEndOnce) {
    const pyx::CapturedLines log(pyx::systemLogSink());
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    writeSamples(file, 5);
    ReplayTransport::Options options;
    options.file = file;
    options.speed = 0;
    options.loop = true;
    ReplayTransport replay(options);
    replay.performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr);
    Collector collector;
    replay.startEvents(collector.sink());
    ASSERT_TRUE(collector.waitForCount(23));
    replay.stopEvents();
    const auto events = collector.events();
    for (std::size_t i = 0; i < events.size(); ++i)
        ASSERT_EQ(sequenceOf(events[i].object), static_cast<std::int64_t>(i % 5)) << i;
    const auto lines = log.lines();
    EXPECT_EQ(std::count_if(lines.begin(), lines.end(),
                            [](const std::string& line) {
                                return line.find("end of the recording") != std::string::npos;
                            }),
              1);
    EXPECT_FALSE(replay.finished());
}

TEST(Replay, AnEmptyRecordingWithLoopIsOverAtOnceAndSaysSo) {
    const pyx::CapturedLines log(pyx::systemLogSink());
    const TempDir dir;
    const std::string file = dir.file("empty.pyxrec");
    writeSamples(file, 0);
    std::atomic<int> ends{0};
    ReplayTransport::Options options;
    options.file = file;
    options.speed = 0;
    options.loop = true;
    options.onEnd = [&](bool damaged) {
        EXPECT_FALSE(damaged);
        ++ends;
    };
    ReplayTransport replay(options);
    replay.performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr);
    Collector collector;
    replay.startEvents(collector.sink());
    ASSERT_TRUE(waitUntil([&] { return replay.finished(); }));
    replay.stopEvents();
    EXPECT_TRUE(collector.events().empty());
    EXPECT_EQ(ends, 1);
    const auto lines = log.lines();
    EXPECT_EQ(std::count(lines.begin(), lines.end(),
                         "replay " + file + ": the recording holds no events"),
              1);
}

TEST(Replay, EventsFlowOnceAConfigurationIsPushedAndARestartGoesOnWhereItWas) {
    const pyx::CapturedLines log(pyx::systemLogSink());
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    writeSamples(file, 40);
    ReplayTransport::Options options;
    options.file = file;
    options.speed = 0;
    // The store "takes" the first ten events, then nothing until let go.
    std::atomic<std::size_t> handed{0};
    std::atomic<std::size_t> room{10};
    options.maxBacklog = 4;
    options.backlog = [&] { return handed >= room ? std::size_t{1000} : std::size_t{0}; };
    ReplayTransport replay(options);

    Collector before;
    replay.startEvents(before.sink());
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    EXPECT_TRUE(before.events().empty());

    EXPECT_EQ(
        replay.performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr).code,
        velk::kCodeSuccess);
    Collector first;
    const auto firstSink = first.sink();
    replay.startEvents([&](const std::string& stream, Value object) {
        ++handed;
        firstSink(stream, std::move(object));
    });
    ASSERT_TRUE(first.waitForCount(10));
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    replay.stopEvents();
    ASSERT_EQ(first.events().size(), 10u);

    room = 1000;
    Collector second;
    replay.startEvents(second.sink());
    ASSERT_TRUE(waitUntil([&] { return replay.finished(); }));
    const auto secondEvents = second.events();
    ASSERT_EQ(secondEvents.size(), 30u);
    for (std::size_t i = 0; i < secondEvents.size(); ++i)
        EXPECT_EQ(sequenceOf(secondEvents[i].object), static_cast<std::int64_t>(10 + i));
}

TEST(Replay, ADamagedRecordingPlaysWhatCanBeReadThenSaysWhereItBrokeOff) {
    const TempDir dir;
    const std::string file = dir.file("cut.pyxrec");
    {
        RecordingWriter writer(recordingOptions(file));
        for (int n = 0; n < 3000; ++n) writer.add(velk::kEventMetric, sampleEvent(n, 40));
    }
    std::filesystem::resize_file(file, std::filesystem::file_size(file) / 2);
    const pyx::CapturedLines log(pyx::systemLogSink());
    std::atomic<int> ends{0};
    std::atomic<int> damagedEnds{0};
    ReplayTransport::Options options;
    options.file = file;
    options.speed = 0;
    options.onEnd = [&](bool damaged) {
        ++ends;
        if (damaged) ++damagedEnds;
    };
    ReplayTransport replay(options);
    replay.performCommand(velk::kCommandAddConfiguration, configurationInput(), nullptr);
    Collector collector;
    replay.startEvents(collector.sink());
    ASSERT_TRUE(waitUntil([&] { return replay.finished(); }));
    replay.stopEvents();
    EXPECT_EQ(ends, 1);
    EXPECT_EQ(damagedEnds, 1);
    const auto events = collector.events();
    ASSERT_GT(events.size(), 500u);
    ASSERT_LT(events.size(), 3000u);
    for (std::size_t i = 0; i < events.size(); ++i)
        ASSERT_EQ(sequenceOf(events[i].object), static_cast<std::int64_t>(i));
    const auto lines = log.lines();
    ASSERT_EQ(lines.size(), 1u);
    // Where the cut falls, between two events or within one, decides which of the two it says.
    EXPECT_TRUE(lines[0].starts_with("replay " + file + ": damaged after event ") ||
                lines[0].starts_with("replay " + file + ": damaged at event "))
        << lines[0];
    EXPECT_TRUE(lines[0].ends_with("; the replay stops here")) << lines[0];
}

std::string refusal(const std::string& choice, double speed = 1.0) {
    pyx::sources::SourceOptions options;
    options.choice = pyx::sources::parseSource(choice);
    options.speed = speed;
    try {
        static_cast<void>(pyx::sources::makeTransport(options));
    } catch (const pyx::sources::SourceError& e) {
        return e.what();
    }
    return "(accepted)";
}

TEST(Replay, BadFilesAreRefusedWithOneLineNamingTheFile) {
    const TempDir dir;
    EXPECT_EQ(refusal("replay:" + dir.file("gone.pyxrec")),
              "--source replay: " + dir.file("gone.pyxrec") + ": no such file");
    EXPECT_EQ(refusal("replay:" + dir.path().string()),
              "--source replay: " + dir.path().string() + ": is a directory, not a recording");
    const std::string notes = dir.file("notes.txt");
    std::ofstream(notes) << std::string(500, 'x');
    EXPECT_EQ(refusal("replay:" + notes),
              "--source replay: " + notes + ": not a Pyxon recording (not an SQLite database)");
}

TEST(Replay, ASpeedOfZeroIsAcceptedForAReplayAndANegativeOneIsRefused) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    writeSamples(file, 1);
    EXPECT_EQ(refusal("replay:" + file, 0.0), "(accepted)");
    EXPECT_EQ(refusal("replay:" + file, -1.0),
              "the replay speed must be 0 (as fast as taken) or more, not -1");
    EXPECT_EQ(refusal("sim", 0.0),
              "the simulated baseband's speed must be a positive number, not 0");
}

}  // namespace
