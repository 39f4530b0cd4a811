// One point of a series: every value that arrived within one time slot, merged so that the
// slot keeps its lowest and highest value (a dip stays visible however coarse the slot).
#pragma once

#include <cstdint>

namespace pyx {

struct Bucket {
    std::int64_t slot = 0;  // the slot's number: time / slot width, rounded down
    double timeMs = 0;      // when the slot's first value arrived, ms since 1970
    float min = 0;
    float max = 0;
    float last = 0;
    std::uint32_t count = 0;  // values merged into the slot
};

}  // namespace pyx
