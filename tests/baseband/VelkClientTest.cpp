#include <gtest/gtest.h>

#include <cstring>
#include <future>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "baseband/velk/Client.h"
#include "tests/baseband/FakeTransport.h"

namespace {

using pyx::Dict;
using pyx::Value;
using pyx::testing::FakeTransport;

// Collects what a handler receives, and on which thread.
struct Received {
    std::mutex mutex;
    std::vector<Value> events;
    std::vector<bool> onQueue;

    auto handler(pyx::SerialQueue& queue) {
        return [this, &queue](const Value& event) {
            const std::lock_guard lock(mutex);
            events.push_back(event);
            onQueue.push_back(queue.isCurrent());
        };
    }
    std::size_t count() {
        const std::lock_guard lock(mutex);
        return events.size();
    }
};

class VelkClient : public ::testing::Test {
  protected:
    void TearDown() override { velk::client::SetTransportFactory(nullptr); }

    pyx::SerialQueue queue_{"velk.client.test"};
    std::shared_ptr<FakeTransport> transport_ = std::make_shared<FakeTransport>();
};

TEST_F(VelkClient, DefaultResultHoldsTheNotSetCodeAndAnEmptyMessage) {
    const velk::Result result;
    EXPECT_EQ(result.code, static_cast<std::int32_t>(0xE020E002U));
    EXPECT_TRUE(result.message.empty());
    EXPECT_FALSE(result.ok());
}

TEST_F(VelkClient, KeyConstantsAreTheirOwnNames) {
    EXPECT_STREQ(velk::kKeyAppID, "kKeyAppID");
    EXPECT_STREQ(velk::kKeyPayload, "kKeyPayload");
    EXPECT_STREQ(velk::kKeyPayloadType, "kKeyPayloadType");
    EXPECT_STREQ(velk::kKeyTriggerRef, "kKeyTriggerRef");
    EXPECT_STREQ(velk::kKeyTriggerType, "kKeyTriggerType");
    EXPECT_STREQ(velk::kKeyTriggerID, "kKeyTriggerID");
    EXPECT_STREQ(velk::kKeyProfileID, "kKeyProfileID");
    EXPECT_STREQ(velk::kKeyMetricID, "kKeyMetricID");
    EXPECT_STRNE(velk::kEventTrigger, velk::kEventMetric);
}

TEST_F(VelkClient, WithoutATransportFactoryCommandsFailWithNoBasebandTransport) {
    velk::client::SetTransportFactory(nullptr);
    const auto manager = velk::client::CreateManager("pyxtool", queue_);
    ASSERT_NE(manager, nullptr);
    const velk::Result result = velk::client::PerformCommand(
        manager, velk::kCommandClearConfiguration, Value(Dict{}), nullptr);
    EXPECT_EQ(result.code, velk::kCodeNoTransport);
    EXPECT_NE(result.code, 0);
    EXPECT_EQ(result.message, "no baseband transport");
    // Switching events on and off without a transport does nothing, and does not fail.
    velk::client::EventsOn(manager);
    velk::client::EventsOff(manager);
}

TEST_F(VelkClient, ANullManagerAnswersNoBasebandTransport) {
    const velk::Result result =
        velk::client::PerformCommand(nullptr, velk::kCommandQueryMetric, Value(), nullptr);
    EXPECT_EQ(result, velk::Result(velk::kCodeNoTransport, "no baseband transport"));
}

TEST_F(VelkClient, CreateManagerUsesTheRegisteredFactoryAndConnectsWithTheClientName) {
    int made = 0;
    velk::client::SetTransportFactory([&] {
        ++made;
        return transport_;
    });
    const auto manager = velk::client::CreateManager("pyxtool", queue_);
    EXPECT_EQ(made, 1);
    EXPECT_EQ(manager->name(), "pyxtool");
    EXPECT_EQ(&manager->queue(), &queue_);
    EXPECT_EQ(transport_->clientName(), "pyxtool");
}

TEST_F(VelkClient, PerformCommandSendsNameAndInputAndReturnsTheTransportsResult) {
    const auto manager = velk::client::CreateManager("pyxtool", queue_, transport_);
    transport_->answerWith(velk::Result(-5, "refused"));
    Value output;
    const Value input(Dict{{"a", Value(std::int64_t{1})}});
    const velk::Result result =
        velk::client::PerformCommand(manager, velk::kCommandAddConfiguration, input, &output);
    EXPECT_EQ(result, velk::Result(-5, "refused"));
    ASSERT_EQ(transport_->commands().size(), 1U);
    EXPECT_EQ(transport_->commands()[0].name, velk::kCommandAddConfiguration);
    EXPECT_EQ(transport_->commands()[0].input, input);
    EXPECT_TRUE(output.isDict());
}

TEST_F(VelkClient, HandlersRunOnTheManagersQueueWithOneEventEach) {
    const auto manager = velk::client::CreateManager("pyxtool", queue_, transport_);
    Received metrics;
    Received triggers;
    velk::client::RegisterEventHandler(manager, velk::kEventMetric, metrics.handler(queue_));
    velk::client::RegisterEventHandler(manager, velk::kEventTrigger, triggers.handler(queue_));
    velk::client::EventsOn(manager);
    ASSERT_TRUE(transport_->emit(velk::kEventMetric, Value(Dict{{"n", Value(std::int64_t{1})}})));
    ASSERT_TRUE(transport_->emit(velk::kEventMetric, Value(Dict{{"n", Value(std::int64_t{2})}})));
    ASSERT_TRUE(transport_->emit(velk::kEventTrigger, Value(Dict{{"t", Value(true)}})));
    queue_.waitIdle();
    ASSERT_EQ(metrics.count(), 2U);
    EXPECT_EQ(metrics.events[0], Value(Dict{{"n", Value(std::int64_t{1})}}));
    EXPECT_EQ(metrics.events[1], Value(Dict{{"n", Value(std::int64_t{2})}}));
    ASSERT_EQ(triggers.count(), 1U);
    for (const bool onQueue : metrics.onQueue) EXPECT_TRUE(onQueue);
    for (const bool onQueue : triggers.onQueue) EXPECT_TRUE(onQueue);
}

TEST_F(VelkClient, ASecondHandlerForTheSameEventReplacesTheFirst) {
    const auto manager = velk::client::CreateManager("pyxtool", queue_, transport_);
    Received first;
    Received second;
    velk::client::RegisterEventHandler(manager, velk::kEventMetric, first.handler(queue_));
    velk::client::RegisterEventHandler(manager, velk::kEventMetric, second.handler(queue_));
    velk::client::EventsOn(manager);
    transport_->emit(velk::kEventMetric, Value(Dict{}));
    queue_.waitIdle();
    EXPECT_EQ(first.count(), 0U);
    EXPECT_EQ(second.count(), 1U);
}

TEST_F(VelkClient, EventsOfAStreamWithoutHandlerAreDropped) {
    const auto manager = velk::client::CreateManager("pyxtool", queue_, transport_);
    Received metrics;
    velk::client::RegisterEventHandler(manager, velk::kEventMetric, metrics.handler(queue_));
    velk::client::EventsOn(manager);
    transport_->emit(velk::kEventTrigger, Value(Dict{}));
    queue_.waitIdle();
    EXPECT_EQ(metrics.count(), 0U);
}

TEST_F(VelkClient, EventsOnTwiceStartsTheTransportOnce) {
    const auto manager = velk::client::CreateManager("pyxtool", queue_, transport_);
    velk::client::EventsOn(manager);
    velk::client::EventsOn(manager);
    EXPECT_EQ(transport_->starts(), 1);
    EXPECT_TRUE(transport_->delivering());
}

TEST_F(VelkClient, EventsOffStopsTheTransportAndDropsEventsStillQueued) {
    const auto manager = velk::client::CreateManager("pyxtool", queue_, transport_);
    Received metrics;
    velk::client::RegisterEventHandler(manager, velk::kEventMetric, metrics.handler(queue_));
    velk::client::EventsOn(manager);
    // Hold the queue so the event waits on it while delivery is switched off.
    std::promise<void> release;
    std::shared_future<void> released = release.get_future().share();
    queue_.post([released] { released.wait(); });
    ASSERT_TRUE(transport_->emit(velk::kEventMetric, Value(Dict{})));
    velk::client::EventsOff(manager);
    release.set_value();
    queue_.waitIdle();
    EXPECT_EQ(metrics.count(), 0U);
    EXPECT_FALSE(transport_->delivering());
    EXPECT_FALSE(transport_->emit(velk::kEventMetric, Value(Dict{})));
}

TEST_F(VelkClient, EventsOnAgainAfterOffDeliversAgain) {
    const auto manager = velk::client::CreateManager("pyxtool", queue_, transport_);
    Received metrics;
    velk::client::RegisterEventHandler(manager, velk::kEventMetric, metrics.handler(queue_));
    velk::client::EventsOn(manager);
    velk::client::EventsOff(manager);
    velk::client::EventsOn(manager);
    transport_->emit(velk::kEventMetric, Value(Dict{}));
    queue_.waitIdle();
    EXPECT_EQ(metrics.count(), 1U);
    EXPECT_EQ(transport_->switchCalls(), (std::vector<std::string>{"start", "stop", "start"}));
}

TEST_F(VelkClient, DestroyingTheManagerStopsDeliveryAndDropsQueuedEvents) {
    Received metrics;
    std::promise<void> release;
    std::shared_future<void> released = release.get_future().share();
    {
        const auto manager = velk::client::CreateManager("pyxtool", queue_, transport_);
        velk::client::RegisterEventHandler(manager, velk::kEventMetric, metrics.handler(queue_));
        velk::client::EventsOn(manager);
        queue_.post([released] { released.wait(); });
        transport_->emit(velk::kEventMetric, Value(Dict{}));
    }
    EXPECT_FALSE(transport_->delivering());
    release.set_value();
    queue_.waitIdle();
    EXPECT_EQ(metrics.count(), 0U);
}

}  // namespace
