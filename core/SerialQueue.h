// A serial queue: one named thread that runs posted tasks one at a time, in order.
// The baseband manager delivers its events on one of these.
#pragma once

#include <condition_variable>
#include <deque>
#include <functional>
#include <mutex>
#include <string>
#include <thread>

namespace pyx {

class SerialQueue {
  public:
    using Task = std::function<void()>;

    explicit SerialQueue(std::string label);
    // Runs the tasks still queued, then joins the thread.
    ~SerialQueue();
    SerialQueue(const SerialQueue&) = delete;
    SerialQueue& operator=(const SerialQueue&) = delete;

    [[nodiscard]] const std::string& label() const { return label_; }
    // Safe from any thread, also from a task of this queue.
    void post(Task task);
    // Whether the calling thread is this queue's thread.
    [[nodiscard]] bool isCurrent() const { return std::this_thread::get_id() == thread_.get_id(); }
    // Blocks until every task posted before this call has run. Not from the queue's own thread.
    void waitIdle();
    // Tasks posted and not finished yet, the running one included (a measure of backlog).
    [[nodiscard]] std::size_t pending() const;

  private:
    void loop();

    const std::string label_;
    mutable std::mutex mutex_;
    std::condition_variable wake_;
    std::condition_variable idle_;
    std::deque<Task> tasks_;
    bool running_task_ = false;
    bool stopping_ = false;
    std::thread thread_;
};

}  // namespace pyx
