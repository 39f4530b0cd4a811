// GSM received levels and bands as our messages hold them.
#pragma once

#include <algorithm>
#include <cstdint>
#include <optional>

namespace pyx::diag {

// The RXLEV of a received power given in 1/16 dBm, as 3GPP TS 45.008 reports it: 0 below
// -110 dBm, n for -111 + n <= P < -110 + n, 63 from -48 dBm. The store shows RXLEV - 110 dBm,
// the top of the level's 1 dB step.
[[nodiscard]] constexpr std::uint32_t rxLevOfSixteenths(std::int32_t rxPower16) {
    const std::int32_t floorDbm =
        rxPower16 >= 0 ? rxPower16 / 16 : -((-rxPower16 + 15) / 16);  // rounded down
    return static_cast<std::uint32_t>(std::clamp(floorDbm + 111, 0, 63));
}

// The band of a GSM ARFCN when the number lies in exactly one band (3GPP TS 45.005); nothing
// where bands share numbers (P-, E- and R-GSM 900 from 0 to 124 and from 955 to 1023, DCS 1800
// and PCS 1900 from 512 to 810), since the packets' band code is not documented.
[[nodiscard]] std::optional<std::int32_t> gsmBandOfArfcn(std::uint32_t arfcn);

}  // namespace pyx::diag
