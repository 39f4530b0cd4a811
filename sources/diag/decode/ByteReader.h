// Little-endian reads of a log packet's fields, PLMN digits and the catalogue's metric IDs,
// shared by the DIAG decoders of every technology.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>

#include "core/MetricKindList.h"

namespace pyx::diag::decode {

// The catalogue's metric IDs, named by their constants.
namespace id {
enum MetricID : std::int64_t {
#define PYX_DIAG_KIND_ID(constant, metricID, ...) constant = (metricID),
    PYX_METRIC_KINDS(PYX_DIAG_KIND_ID)
#undef PYX_DIAG_KIND_ID
};
}  // namespace id

// Reads of fixed-width little-endian values at an offset the caller has checked to fit.
class Reader {
  public:
    explicit Reader(std::span<const std::uint8_t> bytes) : bytes_(bytes) {}

    [[nodiscard]] std::size_t size() const { return bytes_.size(); }
    [[nodiscard]] bool fits(std::size_t offset, std::size_t count) const {
        return offset <= bytes_.size() && count <= bytes_.size() - offset;
    }
    [[nodiscard]] std::uint8_t u8(std::size_t at) const { return bytes_[at]; }
    [[nodiscard]] std::int8_t i8(std::size_t at) const {
        return static_cast<std::int8_t>(bytes_[at]);
    }
    [[nodiscard]] std::uint16_t u16(std::size_t at) const {
        return static_cast<std::uint16_t>(bytes_[at] | bytes_[at + 1] << 8);
    }
    [[nodiscard]] std::int16_t i16(std::size_t at) const {
        return static_cast<std::int16_t>(u16(at));
    }
    [[nodiscard]] std::uint32_t u32(std::size_t at) const {
        return static_cast<std::uint32_t>(u16(at)) | static_cast<std::uint32_t>(u16(at + 2)) << 16;
    }
    [[nodiscard]] std::span<const std::uint8_t> bytes(std::size_t at, std::size_t count) const {
        return bytes_.subspan(at, count);
    }

  private:
    std::span<const std::uint8_t> bytes_;
};

struct PlmnDigits {
    std::uint32_t mcc = 0;
    std::uint32_t mnc = 0;
    std::uint32_t mncDigits = 0;  // 2 or 3
};

// A PLMN in the 3-byte BCD form of a location area identity: MCC2 MCC1, MNC3 MCC3, MNC2 MNC1
// (high nibble first as written); MNC3 = F for a two-digit MNC. Nothing when a digit is not one.
[[nodiscard]] inline std::optional<PlmnDigits> bcdPlmn(std::span<const std::uint8_t, 3> b) {
    const auto low = [](std::uint8_t v) { return static_cast<std::uint32_t>(v & 0x0F); };
    const auto high = [](std::uint8_t v) { return static_cast<std::uint32_t>(v >> 4); };
    const std::uint32_t d[6] = {low(b[0]), high(b[0]), low(b[1]),
                                low(b[2]), high(b[2]), high(b[1])};
    for (int i = 0; i < 5; ++i)
        if (d[i] > 9) return std::nullopt;
    if (d[5] > 9 && d[5] != 0x0F) return std::nullopt;
    PlmnDigits p;
    p.mcc = d[0] * 100 + d[1] * 10 + d[2];
    p.mnc = d[3] * 10 + d[4];
    p.mncDigits = 2;
    if (d[5] != 0x0F) {
        p.mnc = p.mnc * 10 + d[5];
        p.mncDigits = 3;
    }
    return p;
}

// A PLMN as one digit per byte: MCC[3] then MNC[3], 0x0F for an absent third MNC digit.
[[nodiscard]] inline std::optional<PlmnDigits> digitPlmn(std::span<const std::uint8_t, 6> b) {
    for (int i = 0; i < 5; ++i)
        if (b[i] > 9) return std::nullopt;
    if (b[5] > 9 && b[5] != 0x0F) return std::nullopt;
    PlmnDigits p;
    p.mcc = b[0] * 100u + b[1] * 10u + b[2];
    p.mnc = b[3] * 10u + b[4];
    p.mncDigits = 2;
    if (b[5] != 0x0F) {
        p.mnc = p.mnc * 10 + b[5];
        p.mncDigits = 3;
    }
    return p;
}

}  // namespace pyx::diag::decode
