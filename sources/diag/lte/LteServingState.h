// What the LTE serving decoders remember between packets.
#pragma once

#include <cstdint>
#include <optional>

#include "sources/diag/decode/ByteReader.h"

namespace pyx::diag {

// The LTE serving cell as the last RRC serving-cell-info (0xB0C2), MIB (0xB0C1) or ML1
// serving-cell-info (0xB197) packet gave it, so that each of them writes the serving-cell info
// whole. A MIB or ML1 packet of another cell (DL EARFCN or PCI) starts the cell anew: what
// 0xB0C2 said of the old one (its identity, TAC, PLMN, uplink) is not carried over.
struct LteServingCell {
    std::uint32_t dlEarfcn = 0;
    std::uint32_t pci = 0;
    std::optional<std::uint32_t> dlBandwidthPrb;  // 6, 15, 25, 50, 75 or 100
    std::optional<std::uint32_t> ulBandwidthPrb;
    std::optional<std::uint32_t> ulEarfcn;
    std::optional<std::uint32_t> band;          // E-UTRA operating band
    std::optional<std::uint32_t> cellIdentity;  // 28 bits
    std::optional<std::uint32_t> tac;
    std::optional<decode::PlmnDigits> plmn;
};

struct LteServingState {
    std::optional<LteServingCell> cell;
};

}  // namespace pyx::diag
