// What the GSM decoders remember between packets.
#pragma once

#include <cstdint>
#include <optional>
#include <vector>

namespace pyx::diag {

// One carrier of the surrounding cells' BCCH allocation (0x5071), with its BSIC once the
// modem has decoded it.
struct GsmBaCell {
    std::uint16_t arfcn = 0;
    std::optional<std::uint8_t> bsic;
};

// One neighbour carrier's last received power (0x507B), in 1/16 dBm.
struct GsmMeasuredCell {
    std::uint16_t arfcn = 0;
    std::int16_t rxPower16 = 0;
};

// Each list is replaced whole by its packet, so neither grows beyond one packet's cells.
struct GsmState {
    std::optional<std::uint16_t> servingArfcn;  // from the last 0x5134
    std::vector<GsmBaCell> baList;
    std::vector<GsmMeasuredCell> measured;
};

}  // namespace pyx::diag
