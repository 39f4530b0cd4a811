// What the NAS decoders remember between packets.
#pragma once

#include <cstdint>

namespace pyx::diag {

struct NasState {
    // The EPS bearers the modem holds active: bit n set for EPS bearer identity n (5 to 15).
    std::uint16_t activeBearers = 0;
};

}  // namespace pyx::diag
