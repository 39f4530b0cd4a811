// The main queue: every delegate call, the whole store and every screen run on it.
//
// Any thread may post. The front end drains it: the Qt event loop (through the wake-up hook),
// or run() in the headless program and the tools.
#pragma once

#include <condition_variable>
#include <deque>
#include <exception>
#include <functional>
#include <mutex>
#include <thread>

namespace pyx {

class MainQueue {
  public:
    using Task = std::function<void()>;

    MainQueue() = default;
    MainQueue(const MainQueue&) = delete;
    MainQueue& operator=(const MainQueue&) = delete;

    // The process's main queue (shared instance).
    static MainQueue& shared();

    void post(Task task);
    // Runs tasks on the calling thread, which becomes the main thread, until stop(); then runs
    // the tasks queued at that moment and returns.
    void run();
    // Safe from any thread, also from a task.
    void stop();
    // Runs the tasks queued at this moment on the calling thread; returns how many ran.
    std::size_t drain();
    // Called (from the posting thread) after every post: the Qt front end schedules a drain.
    void setWakeup(std::function<void()> wakeup);
    // Receives what a task throws, on the main thread; the queue then goes on with the next
    // task. Without a handler the exception leaves run() or drain() (the process ends).
    void setErrorHandler(std::function<void(std::exception_ptr)> handler);

    // The thread that runs the queue: the last to call run() or drain(), or the one that
    // claimed it.
    void claimCurrentThread();
    [[nodiscard]] bool isCurrent() const;
    [[nodiscard]] std::size_t pending() const;

  private:
    void runTask(Task& task);

    mutable std::mutex mutex_;
    std::condition_variable wake_;
    std::deque<Task> tasks_;
    std::function<void()> wakeup_;
    std::function<void(std::exception_ptr)> errorHandler_;
    std::thread::id owner_;
    bool stopping_ = false;
};

}  // namespace pyx
