#include "core/SerialQueue.h"

#include <pthread.h>

namespace pyx {

SerialQueue::SerialQueue(std::string label) : label_(std::move(label)) {
    thread_ = std::thread([this] { loop(); });
    // Thread names are limited to 15 characters; keep the end, which is the telling part.
    const std::string name = label_.size() > 15 ? label_.substr(label_.size() - 15) : label_;
    pthread_setname_np(thread_.native_handle(), name.c_str());
}

SerialQueue::~SerialQueue() {
    {
        const std::lock_guard lock(mutex_);
        stopping_ = true;
    }
    wake_.notify_one();
    thread_.join();
}

void SerialQueue::post(Task task) {
    {
        const std::lock_guard lock(mutex_);
        tasks_.push_back(std::move(task));
    }
    wake_.notify_one();
}

void SerialQueue::waitIdle() {
    std::unique_lock lock(mutex_);
    idle_.wait(lock, [this] { return tasks_.empty() && !running_task_; });
}

std::size_t SerialQueue::pending() const {
    const std::lock_guard lock(mutex_);
    return tasks_.size() + (running_task_ ? 1 : 0);
}

void SerialQueue::loop() {
    std::unique_lock lock(mutex_);
    for (;;) {
        wake_.wait(lock, [this] { return stopping_ || !tasks_.empty(); });
        if (tasks_.empty()) {
            if (stopping_) return;
            continue;
        }
        Task task = std::move(tasks_.front());
        tasks_.pop_front();
        running_task_ = true;
        lock.unlock();
        task();
        task = nullptr;  // release what the task captured before reporting idle
        lock.lock();
        running_task_ = false;
        if (tasks_.empty()) idle_.notify_all();
    }
}

}  // namespace pyx
