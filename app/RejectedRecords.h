// What the program does with a record the store refuses: one line on the system log naming the
// metric ID and the reason, a count, and on with the next event.
#pragma once

#include <cstdint>

#include "core/MainQueue.h"

namespace pyx {

class RejectedRecords {
  public:
    // Becomes queue's error handler; other errors keep ending the program.
    explicit RejectedRecords(MainQueue& queue);
    ~RejectedRecords();
    RejectedRecords(const RejectedRecords&) = delete;
    RejectedRecords& operator=(const RejectedRecords&) = delete;

    [[nodiscard]] std::uint64_t count() const { return count_; }

  private:
    MainQueue& queue_;
    std::uint64_t count_ = 0;  // main thread only
};

}  // namespace pyx
