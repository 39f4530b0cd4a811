// What the UMTS decoders remember between packets.
#pragma once

#include <cstdint>
#include <optional>

namespace pyx::diag {

// The WCDMA serving cell as the last cell-identity packet (0x4127) named it, so that the
// reselection ranking (0x4005) can tell the serving cell from its neighbours.
struct UmtsServingCell {
    std::uint32_t dlUarfcn = 0;
    std::uint32_t psc = 0;
};

struct UmtsState {
    std::optional<UmtsServingCell> serving;
};

}  // namespace pyx::diag
