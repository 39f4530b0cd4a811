// A stop request as a file descriptor: an eventfd that becomes readable when the stop token is
// asked to stop, so that a poll on the port wakes at once instead of at its next timeout.
#pragma once

#include <chrono>
#include <stop_token>

#include "sources/diag/port/UniqueFd.h"

namespace pyx::diag {

class StopSignal {
  public:
    explicit StopSignal(const std::stop_token& stop);
    StopSignal(const StopSignal&) = delete;
    StopSignal& operator=(const StopSignal&) = delete;

    // Readable once stop is requested (for poll).
    [[nodiscard]] int fd() const { return fd_.get(); }
    [[nodiscard]] bool requested() const { return token_.stop_requested(); }
    // Waits for timeout or for the stop request; whether stop was requested.
    bool waitFor(std::chrono::milliseconds timeout) const;

  private:
    struct Notify {
        int fd;
        void operator()() const noexcept;
    };

    UniqueFd fd_;
    std::stop_token token_;
    std::stop_callback<Notify> callback_;  // after fd_: it may run in the constructor
};

}  // namespace pyx::diag
