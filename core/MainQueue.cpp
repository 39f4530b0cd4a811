#include "core/MainQueue.h"

namespace pyx {

MainQueue& MainQueue::shared() {
    static MainQueue queue;
    return queue;
}

void MainQueue::post(Task task) {
    std::function<void()> wakeup;
    {
        const std::lock_guard lock(mutex_);
        tasks_.push_back(std::move(task));
        wakeup = wakeup_;
    }
    wake_.notify_one();
    if (wakeup) wakeup();
}

void MainQueue::run() {
    std::unique_lock lock(mutex_);
    owner_ = std::this_thread::get_id();
    while (!stopping_) {
        wake_.wait(lock, [this] { return stopping_ || !tasks_.empty(); });
        if (stopping_) break;
        Task task = std::move(tasks_.front());
        tasks_.pop_front();
        lock.unlock();
        runTask(task);
        task = nullptr;
        lock.lock();
    }
    // Stopped: run what was queued up to now, not what keeps arriving meanwhile, so that a
    // busy producer cannot hold the loop open.
    std::deque<Task> rest;
    rest.swap(tasks_);
    stopping_ = false;
    lock.unlock();
    for (auto& task : rest) runTask(task);
}

void MainQueue::stop() {
    {
        const std::lock_guard lock(mutex_);
        stopping_ = true;
    }
    wake_.notify_all();
}

std::size_t MainQueue::drain() {
    std::deque<Task> batch;
    {
        const std::lock_guard lock(mutex_);
        owner_ = std::this_thread::get_id();
        batch.swap(tasks_);
    }
    for (auto& task : batch) runTask(task);
    return batch.size();
}

void MainQueue::runTask(Task& task) {
    std::function<void(std::exception_ptr)> handler;
    {
        const std::lock_guard lock(mutex_);
        handler = errorHandler_;
    }
    if (!handler) {
        task();
        return;
    }
    try {
        task();
    } catch (...) {
        handler(std::current_exception());
    }
}

void MainQueue::setErrorHandler(std::function<void(std::exception_ptr)> handler) {
    const std::lock_guard lock(mutex_);
    errorHandler_ = std::move(handler);
}

void MainQueue::setWakeup(std::function<void()> wakeup) {
    const std::lock_guard lock(mutex_);
    wakeup_ = std::move(wakeup);
}

void MainQueue::claimCurrentThread() {
    const std::lock_guard lock(mutex_);
    owner_ = std::this_thread::get_id();
}

bool MainQueue::isCurrent() const {
    const std::lock_guard lock(mutex_);
    return owner_ == std::this_thread::get_id();
}

std::size_t MainQueue::pending() const {
    const std::lock_guard lock(mutex_);
    return tasks_.size();
}

}  // namespace pyx
