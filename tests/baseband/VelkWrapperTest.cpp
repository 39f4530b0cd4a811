#include "baseband/VelkWrapper.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <filesystem>
#include <fstream>
#include <stdexcept>
#include <string>
#include <vector>

#include "core/Log.h"
#include "tests/baseband/FakeTransport.h"
#include "tests/baseband/RecordingDelegate.h"

namespace {

using pyx::Bytes;
using pyx::Dict;
using pyx::Value;
using pyx::testing::FakeTransport;
using pyx::testing::keysOf;
using pyx::testing::RecordingDelegate;

constexpr char kAddName[] = "-[VelkWrapper addTelxConfigForAppId:andProtofFilePath:]";
constexpr char kRemoveName[] = "-[VelkWrapper removeTelxConfigForAppid:]";
constexpr char kQueryName[] =
    "-[VelkWrapper querySpecificMetric:triggerRef:triggerType:triggerID:profileID:metricID:]";

Value metricEvent(std::int64_t metricID) {
    return Value(Dict{{velk::kKeyMetricID, Value(metricID)},
                      {velk::kKeyPayload, Value(Bytes{0x08, 0x01})},
                      {velk::kKeyPayloadType, Value(std::int64_t{0})},
                      {velk::kKeyProfileID, Value(std::int64_t{0})}});
}

Value triggerEvent(std::int64_t triggerID) {
    return Value(Dict{{velk::kKeyTriggerID, Value(triggerID)},
                      {velk::kKeyTriggerRef, Value(std::int64_t{9999})}});
}

class VelkWrapperTest : public ::testing::Test {
  protected:
    void SetUp() override {
        velk::client::SetTransportFactory([transport = transport_] { return transport; });
        wrapper_ = pyx::VelkWrapper::create(mainQueue_);
        configPath_ = std::filesystem::temp_directory_path() /
                      ("velkwrapper-test-" + std::to_string(::getpid()) + ".deviceconfig");
    }
    void TearDown() override {
        velk::client::SetTransportFactory(nullptr);
        std::filesystem::remove(configPath_);
    }

    // Lets every event reach the delegate: the serial queue's handlers, then the main queue.
    void deliver() {
        pyx::VelkWrapper::queue().waitIdle();
        mainQueue_.drain();
    }

    void writeConfig(const std::string& text) {
        std::ofstream out(configPath_, std::ios::binary);
        out << text;
    }

    std::shared_ptr<FakeTransport> transport_ = std::make_shared<FakeTransport>();
    pyx::MainQueue mainQueue_;
    std::shared_ptr<pyx::VelkWrapper> wrapper_;
    std::filesystem::path configPath_;
};

TEST_F(VelkWrapperTest, AppIdPyxtoolIsAcceptedByAllThreeCommands) {
    writeConfig("metric 0x3C4E04 every 1s\n");
    EXPECT_TRUE(wrapper_->removeTelxConfigForAppid("pyxtool"));
    EXPECT_TRUE(wrapper_->addTelxConfigForAppId("pyxtool", configPath_.string()));
    EXPECT_TRUE(wrapper_->querySpecificMetric("pyxtool", 9999, 0, 0x7F0013, 0, 0));
    EXPECT_EQ(transport_->commands().size(), 3U);
}

TEST_F(VelkWrapperTest, AnyOtherAppIdMakesAllThreeCommandsReturnNoWithoutCommandOrLogLine) {
    writeConfig("metric 0x3C4E04 every 1s\n");
    const pyx::CapturedLines log(pyx::systemLogSink());
    for (const char* appId : {"PYXTOOL", "", "pyxtool ", "pyx", "Pyxtool", "other"}) {
        EXPECT_FALSE(wrapper_->removeTelxConfigForAppid(appId)) << appId;
        EXPECT_FALSE(wrapper_->addTelxConfigForAppId(appId, configPath_.string())) << appId;
        EXPECT_FALSE(wrapper_->querySpecificMetric(appId, 9999, 0, 0x7F0013, 0, 0)) << appId;
    }
    EXPECT_TRUE(transport_->commands().empty());
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(VelkWrapperTest, ACommandThatReturnsCodeZeroStillWritesTheLogLineWithErrorZero) {
    transport_->answerWith(velk::Result(0, "Success"));
    writeConfig("metric 0x3C4E04 every 1s\n");
    const pyx::CapturedLines log(pyx::systemLogSink());
    EXPECT_TRUE(wrapper_->addTelxConfigForAppId("pyxtool", configPath_.string()));
    EXPECT_TRUE(wrapper_->removeTelxConfigForAppid("pyxtool"));
    EXPECT_TRUE(wrapper_->querySpecificMetric("pyxtool", 1, 2, 3, 4, 5));
    EXPECT_EQ(log.lines(), (std::vector<std::string>{
                               std::string(kAddName) + ": error=0 msg=Success",
                               std::string(kRemoveName) + ": error=0 msg=Success",
                               std::string(kQueryName) + ": error=0 msg=Success",
                           }));
}

TEST_F(VelkWrapperTest, AFailingCommandLogsItsCodeAndMessageAndReturnsNo) {
    transport_->answerWith(velk::Result(-7, "line 3: expected 'every'"));
    writeConfig("nonsense\n");
    const pyx::CapturedLines log(pyx::systemLogSink());
    EXPECT_FALSE(wrapper_->addTelxConfigForAppId("pyxtool", configPath_.string()));
    EXPECT_FALSE(wrapper_->removeTelxConfigForAppid("pyxtool"));
    EXPECT_FALSE(wrapper_->querySpecificMetric("pyxtool", 1, 2, 3, 4, 5));
    EXPECT_TRUE(log.contains(std::string(kAddName) + ": error=-7 msg=line 3: expected 'every'"));
    EXPECT_TRUE(log.contains(std::string(kRemoveName) + ": error=-7 msg=line 3: expected 'every'"));
    EXPECT_TRUE(log.contains(std::string(kQueryName) + ": error=-7 msg=line 3: expected 'every'"));
}

TEST_F(VelkWrapperTest, TheAppIdValueIsTheIntegerTwoInEveryCommand) {
    writeConfig("x");
    wrapper_->addTelxConfigForAppId("pyxtool", configPath_.string());
    wrapper_->removeTelxConfigForAppid("pyxtool");
    wrapper_->querySpecificMetric("pyxtool", 9999, 0, 0x7F0013, 0, 0);
    const auto commands = transport_->commands();
    ASSERT_EQ(commands.size(), 3U);
    for (const auto& command : commands) {
        const Value* appID = command.input.asDict().find(velk::kKeyAppID);
        ASSERT_NE(appID, nullptr) << command.name;
        EXPECT_EQ(*appID, Value(std::int64_t{2})) << command.name;
    }
}

TEST_F(VelkWrapperTest, AddConfigurationSendsTheWholeFileUnderItsKeysInOrder) {
    std::string contents = "# drive\nmetric 0x3C4E04 every 1s\n";
    contents.push_back('\0');
    contents += "tail";
    writeConfig(contents);
    ASSERT_TRUE(wrapper_->addTelxConfigForAppId("pyxtool", configPath_.string()));
    const auto commands = transport_->commands();
    ASSERT_EQ(commands.size(), 1U);
    EXPECT_EQ(commands[0].name, velk::kCommandAddConfiguration);
    EXPECT_EQ(keysOf(commands[0].input),
              (std::vector<std::string>{"kKeyAppID", "kKeyPayload", "kKeyPayloadType"}));
    const Dict& input = commands[0].input.asDict();
    EXPECT_EQ(*input.find(velk::kKeyPayload), Value(Bytes(contents.begin(), contents.end())));
    EXPECT_EQ(*input.find(velk::kKeyPayloadType), Value(std::int64_t{0}));
}

TEST_F(VelkWrapperTest, AnUnreadableConfigurationFileIsSentAsEmptyBytes) {
    const std::string missing = (configPath_.parent_path() / "no-such-dir" / "none").string();
    EXPECT_TRUE(wrapper_->addTelxConfigForAppId("pyxtool", missing));
    const auto commands = transport_->commands();
    ASSERT_EQ(commands.size(), 1U);
    EXPECT_EQ(*commands[0].input.asDict().find(velk::kKeyPayload), Value(Bytes{}));
}

TEST_F(VelkWrapperTest, ClearConfigurationSendsOnlyTheAppId) {
    ASSERT_TRUE(wrapper_->removeTelxConfigForAppid("pyxtool"));
    const auto commands = transport_->commands();
    ASSERT_EQ(commands.size(), 1U);
    EXPECT_EQ(commands[0].name, velk::kCommandClearConfiguration);
    EXPECT_EQ(commands[0].input, Value(Dict{{"kKeyAppID", Value(std::int64_t{2})}}));
}

TEST_F(VelkWrapperTest, QuerySendsItsSevenKeysInOrderWithSignExtendedValues) {
    ASSERT_TRUE(wrapper_->querySpecificMetric("pyxtool", -1, 0, 0x7F0013, -2147483647 - 1, 7));
    const auto commands = transport_->commands();
    ASSERT_EQ(commands.size(), 1U);
    EXPECT_EQ(commands[0].name, velk::kCommandQueryMetric);
    const Value expected(Dict{
        {"kKeyAppID", Value(std::int64_t{2})},
        {"kKeyPayloadType", Value(std::int64_t{0})},
        {"kKeyTriggerRef", Value(std::int64_t{-1})},
        {"kKeyTriggerType", Value(std::int64_t{0})},
        {"kKeyTriggerID", Value(std::int64_t{0x7F0013})},
        {"kKeyProfileID", Value(std::int64_t{-2147483648LL})},
        {"kKeyMetricID", Value(std::int64_t{7})},
    });
    EXPECT_EQ(commands[0].input, expected);
    EXPECT_EQ(keysOf(commands[0].input),
              (std::vector<std::string>{"kKeyAppID", "kKeyPayloadType", "kKeyTriggerRef",
                                        "kKeyTriggerType", "kKeyTriggerID", "kKeyProfileID",
                                        "kKeyMetricID"}));
}

TEST_F(VelkWrapperTest, TheManagerClientIsNamedPyxtool) {
    EXPECT_EQ(transport_->clientName(), "pyxtool");
}

TEST_F(VelkWrapperTest, WithoutATransportCommandsReturnNoAndLogTheReason) {
    velk::client::SetTransportFactory(nullptr);
    const auto wrapper = pyx::VelkWrapper::create(mainQueue_);
    const pyx::CapturedLines log(pyx::systemLogSink());
    EXPECT_FALSE(wrapper->removeTelxConfigForAppid("pyxtool"));
    EXPECT_EQ(log.lines(), (std::vector<std::string>{std::string(kRemoveName) + ": error=" +
                                                     std::to_string(velk::kCodeNoTransport) +
                                                     " msg=no baseband transport"}));
}

TEST_F(VelkWrapperTest, ListenLogsThatItIsListening) {
    const pyx::CapturedLines log(pyx::systemLogSink());
    wrapper_->listen();
    EXPECT_EQ(log.lines(),
              (std::vector<std::string>{"-[VelkWrapper listen]: listening for events"}));
    EXPECT_TRUE(transport_->delivering());
}

TEST_F(VelkWrapperTest, WithNoDelegateSetEventsAreLoggedAndDropped) {
    wrapper_->listen();
    const pyx::CapturedLines log(pyx::systemLogSink());
    ASSERT_TRUE(transport_->emit(velk::kEventMetric, metricEvent(3952132)));
    ASSERT_TRUE(transport_->emit(velk::kEventTrigger, triggerEvent(0x7F0013)));
    pyx::VelkWrapper::queue().waitIdle();
    EXPECT_EQ(log.lines().size(), 2U);
    EXPECT_EQ(mainQueue_.pending(), 0U);
    // A delegate set afterwards does not receive what was dropped.
    const auto delegate = std::make_shared<RecordingDelegate>();
    wrapper_->setDelegate(delegate);
    deliver();
    EXPECT_TRUE(delegate->metrics().empty());
    EXPECT_TRUE(delegate->events().empty());
}

TEST_F(VelkWrapperTest, EventLogLinesShowTheRecordsDictionary) {
    wrapper_->listen();
    const pyx::CapturedLines log(pyx::systemLogSink());
    transport_->emit(velk::kEventMetric, metricEvent(3952132));
    transport_->emit(velk::kEventTrigger, triggerEvent(8323091));
    pyx::VelkWrapper::queue().waitIdle();
    EXPECT_EQ(log.lines(),
              (std::vector<std::string>{
                  "-[VelkWrapper listen]_block_invoke: MetricsTrigger dict={kKeyMetricID: "
                  "3952132, kKeyPayload: <0801>, kKeyPayloadType: 0, kKeyProfileID: 0}",
                  "-[VelkWrapper listen]_block_invoke: EventTrigger dict={kKeyTriggerID: "
                  "8323091, kKeyTriggerRef: 9999}",
              }));
}

TEST_F(VelkWrapperTest, TwoConsecutiveListenCallsLeaveExactlyOneActiveDelivery) {
    const auto delegate = std::make_shared<RecordingDelegate>();
    wrapper_->setDelegate(delegate);
    wrapper_->listen();
    wrapper_->listen();
    EXPECT_EQ(transport_->switchCalls(), (std::vector<std::string>{"start", "stop", "start"}));
    EXPECT_TRUE(transport_->delivering());
    transport_->emit(velk::kEventMetric, metricEvent(3952132));
    transport_->emit(velk::kEventTrigger, triggerEvent(1));
    deliver();
    EXPECT_EQ(delegate->metrics().size(), 1U);
    EXPECT_EQ(delegate->events().size(), 1U);
}

TEST_F(VelkWrapperTest, ATriggerEventNeverReachesMetricsDidUpdate) {
    const auto delegate = std::make_shared<RecordingDelegate>();
    wrapper_->setDelegate(delegate);
    wrapper_->listen();
    transport_->emit(velk::kEventTrigger, triggerEvent(0x7F0013));
    deliver();
    EXPECT_TRUE(delegate->metrics().empty());
    ASSERT_EQ(delegate->events().size(), 1U);
    EXPECT_EQ(delegate->events()[0].record, triggerEvent(0x7F0013).asDict());
}

TEST_F(VelkWrapperTest, AMetricEventNeverReachesEventsDidUpdate) {
    const auto delegate = std::make_shared<RecordingDelegate>();
    wrapper_->setDelegate(delegate);
    wrapper_->listen();
    transport_->emit(velk::kEventMetric, metricEvent(3932179));
    deliver();
    EXPECT_TRUE(delegate->events().empty());
    ASSERT_EQ(delegate->metrics().size(), 1U);
    EXPECT_EQ(delegate->metrics()[0].record, metricEvent(3932179).asDict());
}

TEST_F(VelkWrapperTest, EventsAreHandedOverOnlyWhenTheMainQueueRuns) {
    const auto delegate = std::make_shared<RecordingDelegate>();
    wrapper_->setDelegate(delegate);
    wrapper_->listen();
    transport_->emit(velk::kEventMetric, metricEvent(3952132));
    pyx::VelkWrapper::queue().waitIdle();
    EXPECT_TRUE(delegate->metrics().empty());
    EXPECT_EQ(mainQueue_.pending(), 1U);
    mainQueue_.drain();
    EXPECT_EQ(delegate->metrics().size(), 1U);
}

TEST_F(VelkWrapperTest, TheDelegateIsHeldWeakly) {
    auto delegate = std::make_shared<RecordingDelegate>();
    wrapper_->setDelegate(delegate);
    EXPECT_EQ(wrapper_->delegate(), delegate);
    wrapper_->listen();
    transport_->emit(velk::kEventMetric, metricEvent(3952132));
    pyx::VelkWrapper::queue().waitIdle();
    // The delegate goes between posting and running: the call goes nowhere.
    const std::weak_ptr<RecordingDelegate> watch = delegate;
    delegate.reset();
    EXPECT_TRUE(watch.expired());
    EXPECT_EQ(wrapper_->delegate(), nullptr);
    EXPECT_EQ(mainQueue_.drain(), 1U);
}

TEST_F(VelkWrapperTest, WhatTheDelegateThrowsReachesTheMainQueuesErrorHandler) {
    const auto delegate = std::make_shared<RecordingDelegate>();
    delegate->onMetric = [](const pyx::MetricRecord&) { throw std::invalid_argument("bad"); };
    wrapper_->setDelegate(delegate);
    wrapper_->listen();
    std::vector<std::string> errors;
    mainQueue_.setErrorHandler([&errors](std::exception_ptr error) {
        try {
            std::rethrow_exception(error);
        } catch (const std::invalid_argument& e) {
            errors.emplace_back(e.what());
        }
    });
    transport_->emit(velk::kEventMetric, metricEvent(1));
    transport_->emit(velk::kEventMetric, metricEvent(2));
    deliver();
    EXPECT_EQ(errors, (std::vector<std::string>{"bad", "bad"}));
    EXPECT_EQ(delegate->metrics().size(), 2U);
}

TEST_F(VelkWrapperTest, EventsStopWhenTheWrapperIsGone) {
    const auto delegate = std::make_shared<RecordingDelegate>();
    wrapper_->setDelegate(delegate);
    wrapper_->listen();
    wrapper_.reset();
    EXPECT_FALSE(transport_->delivering());
    EXPECT_FALSE(transport_->emit(velk::kEventMetric, metricEvent(1)));
    deliver();
    EXPECT_TRUE(delegate->metrics().empty());
}

TEST_F(VelkWrapperTest, AHandedOverEventDoesNotKeepTheWrapperAlive) {
    const auto delegate = std::make_shared<RecordingDelegate>();
    wrapper_->setDelegate(delegate);
    wrapper_->listen();
    transport_->emit(velk::kEventMetric, metricEvent(1));
    pyx::VelkWrapper::queue().waitIdle();
    ASSERT_EQ(mainQueue_.pending(), 1U);
    const std::weak_ptr<pyx::VelkWrapper> watch = wrapper_;
    wrapper_.reset();
    EXPECT_TRUE(watch.expired());
    EXPECT_FALSE(transport_->delivering());
    mainQueue_.drain();
    EXPECT_TRUE(delegate->metrics().empty());
}

TEST(VelkWrapperQueue, TheSerialQueueIsCreatedOncePerProcessWithItsLabel) {
    pyx::SerialQueue& first = pyx::VelkWrapper::queue();
    pyx::SerialQueue& second = pyx::VelkWrapper::queue();
    EXPECT_EQ(&first, &second);
    EXPECT_EQ(first.label(), "com.mirelo.Pyxon.serialQ.queue");
}

TEST(VelkWrapperShared, TheSharedInstanceIsOneInstance) {
    velk::client::SetTransportFactory(nullptr);
    const auto first = pyx::VelkWrapper::sharedInstance();
    ASSERT_NE(first, nullptr);
    EXPECT_EQ(first, pyx::VelkWrapper::sharedInstance());
}

}  // namespace
