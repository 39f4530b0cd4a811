#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <mutex>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "core/MainQueue.h"
#include "core/SerialQueue.h"

TEST(SerialQueue, RunsTasksInPostingOrderOnOneThread) {
    std::vector<int> order;
    std::vector<std::thread::id> threads;
    std::mutex m;
    {
        pyx::SerialQueue q("com.mirelo.Pyxon.test");
        for (int i = 0; i < 100; ++i) {
            q.post([&, i] {
                const std::lock_guard lock(m);
                order.push_back(i);
                threads.push_back(std::this_thread::get_id());
            });
        }
        q.waitIdle();
    }
    ASSERT_EQ(order.size(), 100U);
    for (int i = 0; i < 100; ++i) EXPECT_EQ(order[static_cast<std::size_t>(i)], i);
    for (const auto& id : threads) EXPECT_EQ(id, threads.front());
    EXPECT_NE(threads.front(), std::this_thread::get_id());
}

TEST(SerialQueue, TasksKnowTheyRunOnTheQueue) {
    pyx::SerialQueue q("label");
    EXPECT_EQ(q.label(), "label");
    EXPECT_FALSE(q.isCurrent());
    std::atomic<bool> onQueue{false};
    q.post([&] { onQueue = q.isCurrent(); });
    q.waitIdle();
    EXPECT_TRUE(onQueue);
}

TEST(SerialQueue, DestructionRunsTasksStillQueued) {
    std::atomic<int> ran{0};
    {
        pyx::SerialQueue q("shutdown");
        q.post([] { std::this_thread::sleep_for(std::chrono::milliseconds(20)); });
        for (int i = 0; i < 50; ++i) q.post([&] { ++ran; });
    }
    EXPECT_EQ(ran, 50);
}

TEST(MainQueue, PostFromManyThreadsRunsEverythingOnTheRunningThread) {
    pyx::MainQueue q;
    std::atomic<int> ran{0};
    std::atomic<bool> wrongThread{false};
    const auto mainId = std::this_thread::get_id();
    std::vector<std::thread> posters;
    for (int t = 0; t < 4; ++t) {
        posters.emplace_back([&] {
            for (int i = 0; i < 250; ++i)
                q.post([&] {
                    if (std::this_thread::get_id() != mainId || !q.isCurrent()) wrongThread = true;
                    ++ran;
                });
        });
    }
    std::thread stopper([&] {
        for (auto& p : posters) p.join();
        q.post([&] { q.stop(); });
    });
    q.run();
    stopper.join();
    EXPECT_EQ(ran, 1000);
    EXPECT_FALSE(wrongThread);
}

TEST(MainQueue, KeepsOrderAndDrainsWhatIsQueuedAtStop) {
    pyx::MainQueue q;
    std::vector<int> order;
    q.post([&] { order.push_back(1); });
    q.post([&] {
        order.push_back(2);
        q.stop();
    });
    q.post([&] { order.push_back(3); });
    q.run();
    EXPECT_EQ(order, (std::vector<int>{1, 2, 3}));
    EXPECT_EQ(q.pending(), 0U);
}

TEST(MainQueue, DrainRunsPendingTasksAndWakeupFiresOnPost) {
    pyx::MainQueue q;
    int wakeups = 0;
    q.setWakeup([&] { ++wakeups; });
    int ran = 0;
    q.post([&] { ++ran; });
    q.post([&] { ++ran; });
    EXPECT_EQ(wakeups, 2);
    EXPECT_EQ(q.pending(), 2U);
    EXPECT_EQ(q.drain(), 2U);
    EXPECT_EQ(ran, 2);
    EXPECT_TRUE(q.isCurrent());
}

TEST(MainQueue, ErrorHandlerReceivesWhatATaskThrowsAndTheQueueGoesOn) {
    pyx::MainQueue q;
    std::string caught;
    q.setErrorHandler([&](std::exception_ptr e) {
        try {
            std::rethrow_exception(e);
        } catch (const std::runtime_error& err) {
            caught = err.what();
        }
    });
    int ran = 0;
    q.post([] { throw std::runtime_error("bad record"); });
    q.post([&] { ++ran; });
    EXPECT_EQ(q.drain(), 2U);
    EXPECT_EQ(caught, "bad record");
    EXPECT_EQ(ran, 1);
}

TEST(MainQueue, WithoutErrorHandlerAThrowingTaskEscapesDrain) {
    pyx::MainQueue q;
    q.post([] { throw std::runtime_error("unhandled"); });
    EXPECT_THROW(q.drain(), std::runtime_error);
}

TEST(MainQueue, StopRunsWhatWasQueuedButNotWhatKeepsArriving) {
    pyx::MainQueue q;
    int ran = 0;
    std::function<void()> producer;
    producer = [&] {
        ++ran;
        q.post(producer);  // a source that never lets the queue run empty
    };
    q.post(producer);
    q.post([&] { q.stop(); });
    q.run();
    EXPECT_GE(ran, 1);
    EXPECT_LE(ran, 3);
    EXPECT_GE(q.pending(), 1U);
}
