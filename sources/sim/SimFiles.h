// The SIM's elementary files as KCellularSimCardFiles carries them.
#pragma once

#include <cstdint>
#include <memory>

#include "core/Value.h"

namespace pyx {
class ElementaryFile;
}

namespace pyx::sim {

inline constexpr std::uint32_t kEfIccid = 0x2FE2;
inline constexpr std::uint32_t kEfImsi = 0x6F07;
inline constexpr std::uint32_t kEfAd = 0x6FAD;  // administrative data

[[nodiscard]] std::shared_ptr<ElementaryFile> elementaryFile(std::uint32_t id, Bytes content);

// EF AD's content: UE operation mode and additional information (all zero), then the length
// of the MNC.
[[nodiscard]] Bytes adContent(std::uint32_t mncDigits);

}  // namespace pyx::sim
