// Small conversions shared by the payload writers.
#pragma once

#include <cstdint>

namespace pyx::sim::payloads {

inline std::uint32_t u32(std::int64_t v) {
    return static_cast<std::uint32_t>(v);
}
inline std::int32_t s32(std::int64_t v) {
    return static_cast<std::int32_t>(v);
}

}  // namespace pyx::sim::payloads
