// The simulated drive: a DriveState that evolves in small time steps, and the payload of any
// metric the simulated baseband reports, written from that state with the message classes.
// Deterministic: the same seed gives the same states and payloads.
#pragma once

#include <cstdint>
#include <optional>

#include "core/Value.h"
#include "sources/sim/DriveState.h"
#include "sources/sim/Random.h"

namespace pyx::sim {

class Drive {
  public:
    explicit Drive(std::uint64_t seed);

    // Moves the drive on by elapsedMs of simulated time.
    void advance(std::uint64_t elapsedMs);

    // The encoded payload of metricID at timestampMs (ms since 1970), or nothing when the
    // simulated baseband does not report that metric.
    [[nodiscard]] std::optional<Bytes> payload(std::int64_t metricID, std::uint64_t timestampMs);

    [[nodiscard]] const DriveState& state() const { return state_; }

    // Whether payload() writes metricID.
    [[nodiscard]] static bool reports(std::int64_t metricID);

  private:
    void advanceRrc(std::uint64_t elapsedMs);
    void advanceRadio();
    void advanceNeighbours();
    void advanceCarriers();

    Random random_;
    DriveState state_;
};

}  // namespace pyx::sim
