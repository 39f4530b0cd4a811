#include "tools/PositionJoin.h"

#include <algorithm>

namespace pyx {

PositionJoin::PositionJoin(const recordings::RecordingReader& reader) {
    reader.forEachPosition([this](const gps::Fix& fix) {
        fixes_.push_back(fix);
        return true;
    });
}

const gps::Fix* PositionJoin::at(std::int64_t wallNs) const {
    const auto after =
        std::upper_bound(fixes_.begin(), fixes_.end(), wallNs,
                         [](std::int64_t t, const gps::Fix& fix) { return t < fix.receivedNs; });
    if (after == fixes_.begin()) return nullptr;
    const gps::Fix& latest = *std::prev(after);
    return wallNs - latest.receivedNs <= kMaxAgeNs ? &latest : nullptr;
}

}  // namespace pyx
