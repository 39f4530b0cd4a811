#include "metrics/history/SeriesRing.h"

#include <algorithm>
#include <cmath>
#include <stdexcept>

namespace pyx {

SeriesRing::SeriesRing(std::size_t capacity, double slotMs) : buckets_(capacity), slotMs_(slotMs) {
    if (capacity == 0 || !(slotMs > 0)) throw std::invalid_argument("SeriesRing: empty ring");
}

void SeriesRing::add(double timeMs, float value) {
    const auto slot = static_cast<std::int64_t>(std::floor(timeMs / slotMs_));
    if (size_ > 0) {
        Bucket& back = buckets_[(head_ + size_ - 1) % buckets_.size()];
        // The same slot, or a value slightly older than the newest (another kind's clock
        // running a little behind): merged into the newest bucket.
        if (slot <= back.slot) {
            back.min = std::min(back.min, value);
            back.max = std::max(back.max, value);
            back.last = value;
            ++back.count;
            return;
        }
    }
    std::size_t index = 0;
    if (size_ < buckets_.size()) {
        index = (head_ + size_) % buckets_.size();
        ++size_;
    } else {
        index = head_;
        head_ = (head_ + 1) % buckets_.size();
    }
    buckets_[index] = Bucket{slot, timeMs, value, value, value, 1};
}

}  // namespace pyx
