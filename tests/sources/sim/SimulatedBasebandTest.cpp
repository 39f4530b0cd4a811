#include "sources/sim/SimulatedBaseband.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cmath>
#include <condition_variable>
#include <functional>
#include <limits>
#include <mutex>
#include <set>
#include <stdexcept>
#include <thread>
#include <vector>

#include "baseband/VelkWrapper.h"
#include "tests/baseband/RecordingDelegate.h"
#include "tests/sources/sim/Decoders.h"
#include "tests/sources/sim/SimEvents.h"

namespace {

using pyx::Bytes;
using pyx::Dict;
using pyx::Value;
using pyx::sim::SimEvent;
using pyx::sim::SimulatedBaseband;
using pyx::testing::metricIDOf;
using pyx::testing::payloadOf;
using pyx::testing::storedKinds;

constexpr std::uint64_t kStart = 1'700'000'000'000ULL;

// Collects what the simulated baseband hands out, from its timer thread.
class Collector {
  public:
    velk::client::Transport::EventSink sink() {
        return [this](const std::string& stream, Value object) {
            const std::lock_guard lock(mutex_);
            events_.push_back({stream, std::move(object)});
            changed_.notify_all();
        };
    }

    // Waits until done(events) holds; the bound only keeps a broken build from hanging.
    bool waitUntil(const std::function<bool(const std::vector<SimEvent>&)>& done) {
        std::unique_lock lock(mutex_);
        return changed_.wait_for(lock, std::chrono::seconds(120), [&] { return done(events_); });
    }

    std::vector<SimEvent> events() const {
        const std::lock_guard lock(mutex_);
        return events_;
    }
    std::size_t count() const {
        const std::lock_guard lock(mutex_);
        return events_.size();
    }

  private:
    mutable std::mutex mutex_;
    std::condition_variable changed_;
    std::vector<SimEvent> events_;
};

Value addInput(const std::string& text) {
    return Value(Dict{{velk::kKeyAppID, Value(std::int64_t{2})},
                      {velk::kKeyPayload, Value(Bytes(text.begin(), text.end()))},
                      {velk::kKeyPayloadType, Value(std::int64_t{0})}});
}

Value appOnly() {
    return Value(Dict{{velk::kKeyAppID, Value(std::int64_t{2})}});
}

velk::Result push(SimulatedBaseband& sim, const std::string& text) {
    return sim.performCommand(velk::kCommandAddConfiguration, addInput(text), nullptr);
}

SimulatedBaseband::Options fast(std::uint64_t seed) {
    SimulatedBaseband::Options options;
    options.seed = seed;
    options.speed = 500.0;
    options.startTimeMs = kStart;
    return options;
}

TEST(SimulatedBaseband, AnEmptyConfigurationIsRefusedWithACodeAndWhatIsWrong) {
    SimulatedBaseband sim(fast(1));
    const velk::Result result = push(sim, "");
    EXPECT_EQ(result.code, velk::kCodeBadConfiguration);
    EXPECT_NE(result.code, 0);
    EXPECT_EQ(result.message, "the configuration is empty");
    EXPECT_FALSE(sim.configured());
}

TEST(SimulatedBaseband, AnUnparsableConfigurationIsRefusedNamingTheLine) {
    SimulatedBaseband sim(fast(1));
    const velk::Result result = push(sim, "metric 0x3C4E04 every 1s\nmetric 0x3C40C2 evry 5s\n");
    EXPECT_EQ(result.code, velk::kCodeBadConfiguration);
    EXPECT_EQ(result.message, "line 2: expected 'every' after the ID, found 'evry'");
    EXPECT_FALSE(sim.configured());
}

TEST(SimulatedBaseband, AConfigurationNamingAMetricItDoesNotReportIsRefused) {
    SimulatedBaseband sim(fast(1));
    const velk::Result result = push(sim, "metric 0x3C4E04 every 1s\nmetric 0x123456 every 1s\n");
    EXPECT_EQ(result.code, velk::kCodeBadConfiguration);
    EXPECT_EQ(result.message, "line 2: metric 0x123456 is not one this baseband reports");
}

TEST(SimulatedBaseband, ARefusedPushKeepsTheEarlierConfiguration) {
    SimulatedBaseband sim(fast(1));
    ASSERT_EQ(push(sim, "metric 0x3C4E04 every 1s\n").code, 0);
    EXPECT_NE(push(sim, "nonsense\n").code, 0);
    EXPECT_TRUE(sim.configured());
}

TEST(SimulatedBaseband, TheShippedConfigurationIsAccepted) {
    SimulatedBaseband sim(fast(1));
    const velk::Result result = push(sim, pyx::testing::shippedConfigurationText());
    EXPECT_EQ(result.code, 0);
    EXPECT_EQ(result.message, "configuration accepted: 32 metrics, 1 trigger");
    EXPECT_TRUE(sim.configured());
}

TEST(SimulatedBaseband, ClearingTheConfigurationAlwaysSucceeds) {
    SimulatedBaseband sim(fast(1));
    EXPECT_EQ(sim.performCommand(velk::kCommandClearConfiguration, appOnly(), nullptr).code, 0);
    ASSERT_EQ(push(sim, "metric 0x3C4E04 every 1s\n").code, 0);
    EXPECT_EQ(sim.performCommand(velk::kCommandClearConfiguration, appOnly(), nullptr).code, 0);
    EXPECT_FALSE(sim.configured());
}

TEST(SimulatedBaseband, ACommandWithMalformedInputIsRefusedAsBadInput) {
    SimulatedBaseband sim(fast(1));
    EXPECT_EQ(sim.performCommand(velk::kCommandClearConfiguration, Value(), nullptr),
              velk::Result(velk::kCodeBadInput, "the command's input is not a dictionary"));
    EXPECT_EQ(sim.performCommand(velk::kCommandClearConfiguration, Value(Dict{}), nullptr),
              velk::Result(velk::kCodeBadInput, "kKeyAppID is missing or not an integer"));
    EXPECT_EQ(sim.performCommand(velk::kCommandAddConfiguration, appOnly(), nullptr),
              velk::Result(velk::kCodeBadInput, "kKeyPayload is missing or not bytes"));
    EXPECT_EQ(sim.performCommand(velk::kCommandQueryMetric, appOnly(), nullptr),
              velk::Result(velk::kCodeBadInput, "kKeyMetricID is missing or not an integer"));
}

TEST(SimulatedBaseband, AnUnknownCommandIsRefused) {
    SimulatedBaseband sim(fast(1));
    EXPECT_EQ(sim.performCommand("Reboot", appOnly(), nullptr),
              velk::Result(velk::kCodeUnknownCommand, "unknown command 'Reboot'"));
}

TEST(SimulatedBaseband, AQueryForAMetricItDoesNotReportIsRefused) {
    SimulatedBaseband sim(fast(1));
    Dict query = appOnly().asDict();
    query.append(velk::kKeyTriggerID, Value(std::int64_t{0x7F0001}));
    query.append(velk::kKeyMetricID, Value(std::int64_t{0x3C4E25 + 1}));
    EXPECT_EQ(
        sim.performCommand(velk::kCommandQueryMetric, Value(query), nullptr),
        velk::Result(velk::kCodeUnknownMetric, "metric 0x3C4E26 is not one this baseband reports"));
}

TEST(SimulatedBaseband, ASpeedThatIsNotPositiveIsRefused) {
    for (const double speed : {0.0, -1.0, std::nan(""), std::numeric_limits<double>::infinity()}) {
        SimulatedBaseband::Options options;
        options.speed = speed;
        EXPECT_THROW(SimulatedBaseband{options}, std::invalid_argument) << speed;
    }
}

TEST(SimulatedBaseband, WithoutAConfigurationOnlyQueriesAreAnswered) {
    SimulatedBaseband sim(fast(1));
    Collector collector;
    sim.startEvents(collector.sink());
    Dict query = appOnly().asDict();
    query.append(velk::kKeyTriggerRef, Value(std::int64_t{9999}));
    query.append(velk::kKeyTriggerID, Value(std::int64_t{0x7F0013}));
    query.append(velk::kKeyMetricID, Value(std::int64_t{0}));
    ASSERT_EQ(sim.performCommand(velk::kCommandQueryMetric, Value(query), nullptr).code, 0);
    ASSERT_TRUE(collector.waitUntil([](const auto& events) { return events.size() >= 2; }));
    // Several more steps of the timer, with nothing scheduled.
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    sim.stopEvents();
    const auto events = collector.events();
    ASSERT_EQ(events.size(), 2U);
    EXPECT_TRUE(pyx::testing::isTrigger(events[0]));
    EXPECT_EQ(metricIDOf(events[1].object), 0x3C0013);
}

TEST(SimulatedBaseband, EveryStoredKindArrivesDecodableWithinTheFirstSimulatedSeconds) {
    SimulatedBaseband sim(fast(2));
    ASSERT_EQ(push(sim, pyx::testing::shippedConfigurationText()).code, 0);
    Collector collector;
    sim.startEvents(collector.sink());
    const auto allKinds = [](const std::vector<SimEvent>& events) {
        std::set<std::int64_t> seen;
        for (const auto& e : events)
            if (pyx::testing::isMetric(e)) seen.insert(metricIDOf(e.object));
        for (const auto& kind : storedKinds())
            if (!seen.count(kind.first)) return false;
        return true;
    };
    ASSERT_TRUE(collector.waitUntil(allKinds));
    sim.stopEvents();
    for (const auto& e : collector.events()) {
        if (!pyx::testing::isMetric(e)) continue;
        const auto kind = storedKinds().find(metricIDOf(e.object));
        if (kind == storedKinds().end()) continue;
        const auto decoded = kind->second(payloadOf(e.object));
        ASSERT_TRUE(decoded) << std::hex << kind->first;
        // Within a few simulated seconds of the push.
        EXPECT_LT(decoded->dictionary.find("timestamp")->asUInt(), kStart + 5000);
    }
}

TEST(SimulatedBaseband, StopEventsEndsDeliveryAtOnce) {
    SimulatedBaseband sim(fast(2));
    ASSERT_EQ(push(sim, pyx::testing::shippedConfigurationText()).code, 0);
    Collector collector;
    sim.startEvents(collector.sink());
    ASSERT_TRUE(collector.waitUntil([](const auto& events) { return events.size() > 40; }));
    sim.stopEvents();
    const std::size_t atStop = collector.count();
    // Give a still-running timer every chance to deliver more.
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    EXPECT_EQ(collector.count(), atStop);
}

TEST(SimulatedBaseband, StartingAgainReplacesTheSink) {
    SimulatedBaseband sim(fast(2));
    ASSERT_EQ(push(sim, pyx::testing::shippedConfigurationText()).code, 0);
    Collector first;
    Collector second;
    sim.startEvents(first.sink());
    ASSERT_TRUE(first.waitUntil([](const auto& events) { return !events.empty(); }));
    sim.startEvents(second.sink());
    const std::size_t firstCount = first.count();
    ASSERT_TRUE(second.waitUntil([](const auto& events) { return events.size() > 40; }));
    sim.stopEvents();
    EXPECT_EQ(first.count(), firstCount);
}

TEST(SimulatedBaseband, DestroyingItWhileDeliveringStopsTheTimer) {
    Collector collector;
    {
        SimulatedBaseband sim(fast(2));
        ASSERT_EQ(push(sim, pyx::testing::shippedConfigurationText()).code, 0);
        sim.startEvents(collector.sink());
        ASSERT_TRUE(collector.waitUntil([](const auto& events) { return !events.empty(); }));
    }
    const std::size_t atDestruction = collector.count();
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    EXPECT_EQ(collector.count(), atDestruction);
}

TEST(SimulatedBaseband, TheSameSeedGivesTheSameEventsAtAnySpeed) {
    const auto firstEvents = [](double speed) {
        SimulatedBaseband::Options options = fast(9);
        options.speed = speed;
        SimulatedBaseband sim(options);
        EXPECT_EQ(push(sim, pyx::testing::shippedConfigurationText()).code, 0);
        Collector collector;
        sim.startEvents(collector.sink());
        EXPECT_TRUE(collector.waitUntil([](const auto& events) { return events.size() >= 300; }));
        sim.stopEvents();
        auto events = collector.events();
        events.resize(300);
        return events;
    };
    EXPECT_EQ(firstEvents(500.0), firstEvents(2000.0));
}

TEST(SimulatedBaseband, TheSimFilesQueryIsAnsweredThroughTheClient) {
    pyx::MainQueue mainQueue;
    velk::client::SetTransportFactory([] { return std::make_shared<SimulatedBaseband>(fast(3)); });
    const auto wrapper = pyx::VelkWrapper::create(mainQueue);
    velk::client::SetTransportFactory(nullptr);
    const auto delegate = std::make_shared<pyx::testing::RecordingDelegate>();
    wrapper->setDelegate(delegate);
    wrapper->listen();
    ASSERT_TRUE(wrapper->querySpecificMetric("pyxtool", 9999, 0, 0x7F0013, 0, 0));

    // Bounded: a broken build fails instead of hanging.
    for (int i = 0; i < 12000 && delegate->metrics().empty(); ++i) {
        pyx::VelkWrapper::queue().waitIdle();
        mainQueue.drain();
        if (delegate->metrics().empty()) std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    ASSERT_EQ(delegate->events().size(), 1U);
    ASSERT_EQ(delegate->metrics().size(), 1U);
    const pyx::MetricRecord trigger = delegate->events()[0].record;
    EXPECT_EQ(*trigger.find(velk::kKeyTriggerID), Value(std::int64_t{0x7F0013}));
    EXPECT_EQ(*trigger.find(velk::kKeyTriggerRef), Value(std::int64_t{9999}));
    const pyx::MetricRecord sim = delegate->metrics()[0].record;
    EXPECT_EQ(*sim.find(velk::kKeyMetricID), Value(std::int64_t{3932179}));
    EXPECT_TRUE(pyx::KCellularSimCardFiles::initWithData(sim.find(velk::kKeyPayload)->asBytes()));
}

}  // namespace
