// How subscriber and network identities are laid out in bytes, as the SIM files and the NAS
// messages carry them.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "core/Value.h"

namespace pyx::sim {

// The three bytes of a PLMN identity: MCC digit 2|1, MNC digit 3 (or F)|MCC digit 3,
// MNC digit 2|1 (low nibble first in each byte).
[[nodiscard]] Bytes encodePlmn(std::uint32_t mcc, std::uint32_t mnc, std::uint32_t mncDigits);

// An IMSI as BCD with its identity-type nibble: the first byte holds digit 1 and the odd/even
// flag with type 1, then the remaining digits two per byte, low nibble first (8 bytes for 15
// digits). withLength prefixes the length byte, as the SIM's IMSI file does.
[[nodiscard]] Bytes encodeImsi(std::string_view digits, bool withLength);

// An ICCID as swapped BCD: two digits per byte, low nibble first, F-padded.
[[nodiscard]] Bytes encodeIccid(std::string_view digits);

// The Luhn check digit of a digit string.
[[nodiscard]] char luhnCheckDigit(std::string_view digits);

}  // namespace pyx::sim
