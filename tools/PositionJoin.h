// The GPS fixes of a recording, to give each exported event the place it was measured at: the
// latest fix that had arrived when the event did, if it is no older than two seconds (a fix
// that stopped coming says nothing of where later events were).
#pragma once

#include <cstdint>
#include <vector>

#include "gps/Fix.h"
#include "recordings/RecordingReader.h"

namespace pyx {

class PositionJoin {
  public:
    static constexpr std::int64_t kMaxAgeNs = 2'000'000'000;

    // Reads every fix of the recording (a 10-hour drive at 1 Hz is 36,000 fixes, about 3 MB).
    // Throws recordings::RecordingError.
    explicit PositionJoin(const recordings::RecordingReader& reader);

    // The recording holds no positions: the exports then write none of their columns.
    [[nodiscard]] bool empty() const { return fixes_.empty(); }
    [[nodiscard]] const std::vector<gps::Fix>& fixes() const { return fixes_; }
    // The fix for an event that arrived at wallNs (ns since 1970); null when none is recent.
    [[nodiscard]] const gps::Fix* at(std::int64_t wallNs) const;

  private:
    std::vector<gps::Fix> fixes_;  // by arrival time
};

}  // namespace pyx
