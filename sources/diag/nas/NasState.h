// What the NAS decoders remember between packets.
#pragma once

#include <cstdint>
#include <vector>

namespace pyx::diag {

// One EPS bearer context the modem holds active, with the index of the modem's context slot
// that its bearer-state records carry (byte 4).
struct EpsBearer {
    std::uint8_t id = 0;  // EPS bearer identity, 5 to 15
    std::uint8_t slot = 0;
};

// The active EPS bearers in identity order: at most one per identity, so at most 11.
struct NasState {
    std::vector<EpsBearer> bearers;
};

}  // namespace pyx::diag
