// The points of one series: a ring of buckets of fixed capacity, allocated once. Adding a
// value is O(1) and never allocates: it merges into the newest bucket when it falls into the
// same time slot, and otherwise takes the place of the oldest bucket once the ring is full.
#pragma once

#include <cstddef>
#include <vector>

#include "metrics/history/Bucket.h"

namespace pyx {

class SeriesRing {
  public:
    // capacity > 0 buckets of slotMs > 0 each.
    SeriesRing(std::size_t capacity, double slotMs);

    void add(double timeMs, float value);
    void clear() { size_ = 0; }

    [[nodiscard]] std::size_t size() const { return size_; }
    [[nodiscard]] std::size_t capacity() const { return buckets_.size(); }
    [[nodiscard]] bool empty() const { return size_ == 0; }
    // Oldest first.
    [[nodiscard]] const Bucket& at(std::size_t i) const {
        return buckets_[(head_ + i) % buckets_.size()];
    }
    [[nodiscard]] const Bucket& newest() const { return at(size_ - 1); }

  private:
    std::vector<Bucket> buckets_;
    double slotMs_;
    std::size_t head_ = 0;  // the oldest bucket
    std::size_t size_ = 0;
};

}  // namespace pyx
