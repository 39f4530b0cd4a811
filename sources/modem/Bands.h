// Bands derived from channel numbers: exactly, by the 3GPP tables, or not at all.
#pragma once

#include <cstdint>
#include <optional>

namespace pyx::modem {

// The E-UTRA operating band of a downlink EARFCN (3GPP TS 36.101, table 5.7.3-1).
[[nodiscard]] std::optional<std::uint32_t> lteBandOfEarfcn(std::uint32_t earfcn);

// The UTRA FDD operating band (1 for band I...) of a downlink UARFCN (3GPP TS 25.101,
// tables 5.2 and 5.2A); nothing when the number is in no band or in two (V and VI overlap).
[[nodiscard]] std::optional<std::uint32_t> umtsBandOfUarfcn(std::uint32_t uarfcn);

// The band code our WCDMA messages use for a UTRA band number (SYS_BAND_WCDMA_...), when
// there is one.
[[nodiscard]] std::optional<std::uint32_t> wcdmaBandCode(std::uint32_t band);

}  // namespace pyx::modem
