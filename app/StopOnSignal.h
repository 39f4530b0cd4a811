// Ends the program's main loop on SIGINT or SIGTERM: both are blocked in every thread (so make
// one before any thread starts) and taken by one waiting thread, which stops the main queue;
// the queue then runs what was queued by then and its run() returns.
#pragma once

#include <signal.h>  // NOLINT(modernize-deprecated-headers): POSIX sigset_t and sigwait

#include <atomic>
#include <thread>

namespace pyx {

class MainQueue;

class StopOnSignal {
  public:
    explicit StopOnSignal(MainQueue& queue);
    ~StopOnSignal();
    StopOnSignal(const StopOnSignal&) = delete;
    StopOnSignal& operator=(const StopOnSignal&) = delete;

  private:
    sigset_t signals_{};
    std::atomic<bool> done_{false};
    std::thread waiter_;
};

}  // namespace pyx
