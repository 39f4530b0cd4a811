// Ends the program's main loop on SIGINT or SIGTERM: both are blocked in every thread (so make
// one before any thread starts) and taken by one waiting thread, which runs the given action:
// stopping the main queue (headless, pyxonctl listen) or asking the window to quit. Either way
// the program then ends through its own exit path (the source stopped, the recording closed).
#pragma once

#include <signal.h>  // NOLINT(modernize-deprecated-headers): POSIX sigset_t and sigwait

#include <atomic>
#include <functional>
#include <thread>

namespace pyx {

class StopOnSignal {
  public:
    // onSignal runs on the waiting thread, once.
    explicit StopOnSignal(std::function<void()> onSignal);
    ~StopOnSignal();
    StopOnSignal(const StopOnSignal&) = delete;
    StopOnSignal& operator=(const StopOnSignal&) = delete;

  private:
    sigset_t signals_{};
    std::atomic<bool> done_{false};
    std::thread waiter_;
};

}  // namespace pyx
