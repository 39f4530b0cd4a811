// Which thread runs what: the handlers on the serial queue, the delegate on the main queue.
#include <gtest/gtest.h>

#include <mutex>
#include <thread>
#include <vector>

#include "baseband/VelkWrapper.h"
#include "core/Log.h"
#include "tests/baseband/FakeTransport.h"
#include "tests/baseband/RecordingDelegate.h"

namespace {

using pyx::Dict;
using pyx::Value;
using pyx::testing::FakeTransport;
using pyx::testing::RecordingDelegate;

class VelkWrapperThreads : public ::testing::Test {
  protected:
    void SetUp() override {
        velk::client::SetTransportFactory([transport = transport_] { return transport; });
        wrapper_ = pyx::VelkWrapper::create(mainQueue_);
    }
    void TearDown() override {
        pyx::systemLogSink().intercept({});
        velk::client::SetTransportFactory(nullptr);
    }

    std::shared_ptr<FakeTransport> transport_ = std::make_shared<FakeTransport>();
    pyx::MainQueue mainQueue_;
    std::shared_ptr<pyx::VelkWrapper> wrapper_;
};

TEST_F(VelkWrapperThreads, HandlersRunOnTheSerialQueueAndDelegateCallsOnTheMainQueue) {
    // The handler's log line tells on which thread the handler ran.
    std::mutex mutex;
    std::vector<bool> loggedOnSerialQueue;
    std::vector<std::thread::id> loggedOn;
    pyx::systemLogSink().intercept([&](std::string_view) {
        const std::lock_guard lock(mutex);
        loggedOnSerialQueue.push_back(pyx::VelkWrapper::queue().isCurrent());
        loggedOn.push_back(std::this_thread::get_id());
    });

    const auto delegate = std::make_shared<RecordingDelegate>();
    wrapper_->setDelegate(delegate);
    wrapper_->listen();  // logs on this thread
    transport_->emit(velk::kEventMetric, Value(Dict{{"kKeyMetricID", Value(std::int64_t{1})}}));
    transport_->emit(velk::kEventTrigger, Value(Dict{{"kKeyTriggerID", Value(std::int64_t{2})}}));
    pyx::VelkWrapper::queue().waitIdle();

    // The main queue runs on a thread of its own here.
    std::thread::id mainThread;
    std::thread main([&] {
        mainThread = std::this_thread::get_id();
        mainQueue_.run();
    });
    mainQueue_.post([&] { mainQueue_.stop(); });
    main.join();

    pyx::systemLogSink().intercept({});
    ASSERT_EQ(loggedOnSerialQueue.size(), 3U);
    EXPECT_FALSE(loggedOnSerialQueue[0]);  // "listening for events", from the caller
    EXPECT_TRUE(loggedOnSerialQueue[1]);
    EXPECT_TRUE(loggedOnSerialQueue[2]);

    ASSERT_EQ(delegate->metrics().size(), 1U);
    ASSERT_EQ(delegate->events().size(), 1U);
    EXPECT_EQ(delegate->metrics()[0].thread, mainThread);
    EXPECT_EQ(delegate->events()[0].thread, mainThread);
    EXPECT_NE(delegate->metrics()[0].thread, loggedOn[1]);
}

TEST_F(VelkWrapperThreads, CommandsRunSynchronouslyOnTheCallersThread) {
    struct ThreadRecordingTransport : FakeTransport {
        velk::Result performCommand(const std::string& command, const Value& input,
                                    Value* output) override {
            thread = std::this_thread::get_id();
            return FakeTransport::performCommand(command, input, output);
        }
        std::thread::id thread;
    };
    const auto transport = std::make_shared<ThreadRecordingTransport>();
    velk::client::SetTransportFactory([transport] { return transport; });
    const auto wrapper = pyx::VelkWrapper::create(mainQueue_);
    EXPECT_TRUE(wrapper->removeTelxConfigForAppid("pyxtool"));
    EXPECT_EQ(transport->thread, std::this_thread::get_id());
}

}  // namespace
