// The wire types of the protocol-buffer encoding, the low three bits of every key.
#pragma once

#include <cstdint>

namespace pyx {

enum WireType : std::uint8_t {
    kWireVarint = 0,
    kWireFixed64 = 1,
    kWireLengthDelimited = 2,
    kWireStartGroup = 3,
    kWireEndGroup = 4,
    kWireFixed32 = 5,
};

}  // namespace pyx
