// Captures written the way a modem's port writes them, from our own writers: WCDMA cell ID log
// packets (0x4127) framed for the wire, for the transport's and the programs' tests.
#pragma once

#include <cstdint>
#include <span>
#include <string>

#include "core/Value.h"

namespace pyx::diag::test {

// The modem's 1980-01-06 00:00:00 UTC in ms since 1970.
inline constexpr std::uint64_t kModemEpochMs = 315964800000ULL;

// A log header's timestamp for a time in ms since 1970 (a multiple of 5 ms is exact): 1.25 ms
// ticks since kModemEpochMs in the upper 48 bits.
[[nodiscard]] std::uint64_t logTimestamp(std::uint64_t timeMs);

// One serving cell as a 0x4127 packet gives it.
struct CapturedCell {
    std::uint64_t timeMs = 0;  // 0: the modem's clock unset
    std::uint32_t dlUarfcn = 10663;
    std::uint32_t psc = 397;
};

// The 32-byte payload of a WCDMA cell ID packet (MCC 001, MNC 01, LAC 0x1234).
[[nodiscard]] Bytes wcdmaCellPayload(const CapturedCell& cell);
// The cells' log packets, each framed, in order.
[[nodiscard]] Bytes wcdmaCapture(std::span<const CapturedCell> cells);
// Writes bytes to path (replacing it).
void writeBytes(const std::string& path, const Bytes& bytes);

}  // namespace pyx::diag::test
