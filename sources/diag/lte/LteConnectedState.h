// What the LTE connected decoders remember between packets: the serving carriers and their
// neighbours as last measured. The modem logs each carrier in a packet of its own, so the
// carrier aggregation screens are written from what the packets of the last moments measured.
#pragma once

#include <cstdint>
#include <optional>
#include <vector>

namespace pyx::diag {

// A carrier or neighbour list not measured for this long (by the packets' own times) is
// dropped: longer than the longest measurement cycle of a deactivated secondary cell (1.28 s).
inline constexpr std::uint64_t kLteMeasurementKeptMs = 2000;

// One serving carrier as the last serving cell measurement response (0xB193) measured it.
struct LteServingCarrier {
    std::uint32_t index = 0;  // serving-cell index: 0 the primary cell, 1-7 secondary cells
    std::uint32_t earfcn = 0;
    std::uint32_t pci = 0;
    // Over the receive chains, as the modem combines them (in every packet of the captures
    // the better chain's value); hundredths of a dB(m).
    std::int32_t rsrpCentiDb = 0;
    std::int32_t rsrqCentiDb = 0;
    std::int32_t rssiCentiDb = 0;
    std::optional<std::int32_t> snrDb;  // the better of the valid chains', the same way
    std::uint64_t measuredMs = 0;
};

// One neighbour of the connected-mode neighbour measurements (0xB195).
struct LteNeighbourCell {
    std::uint32_t pci = 0;
    std::int32_t rsrpIndex = 0;  // dBm + 140
    std::int32_t rsrqIndex = 0;  // (dB + 19.5) x 2
};

// The neighbours measured on the carrier of one serving cell.
struct LteCarrierNeighbours {
    std::uint32_t servingIndex = 0;
    std::uint32_t earfcn = 0;
    std::vector<LteNeighbourCell> cells;
    std::uint64_t measuredMs = 0;
};

struct LteConnectedState {
    std::vector<LteServingCarrier> carriers;       // by serving-cell index
    std::vector<LteCarrierNeighbours> neighbours;  // by serving-cell index
};

}  // namespace pyx::diag
