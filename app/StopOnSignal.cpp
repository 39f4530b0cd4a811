#include "app/StopOnSignal.h"

#include <pthread.h>

#include <utility>

namespace pyx {

StopOnSignal::StopOnSignal(std::function<void()> onSignal) {
    sigemptyset(&signals_);
    sigaddset(&signals_, SIGINT);
    sigaddset(&signals_, SIGTERM);
    pthread_sigmask(SIG_BLOCK, &signals_, nullptr);
    waiter_ = std::thread([this, onSignal = std::move(onSignal)] {
        int signal = 0;
        sigwait(&signals_, &signal);
        if (!done_) onSignal();
    });
}

StopOnSignal::~StopOnSignal() {
    done_ = true;
    // Wakes the waiter's sigwait (the signal is blocked in every thread); it ends nothing.
    // NOLINTNEXTLINE(bugprone-bad-signal-to-kill-thread)
    pthread_kill(waiter_.native_handle(), SIGTERM);
    waiter_.join();
}

}  // namespace pyx
