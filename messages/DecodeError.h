// Why a payload does not decode, and where: the first thing the reader could not read, with the
// offset of its first byte counted from the start of the whole payload (nested records report
// from the same origin). A message reader that answers false always leaves one in its reader.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace pyx {

class DecodeError {
  public:
    enum class Reason : std::uint8_t {
        TruncatedVarint,    // a varint (key, value or length) runs past the end of its record
        LengthPastEnd,      // a length-delimited value runs past the end of its record
        TruncatedFixed,     // a skipped 64- or 32-bit value runs past the end of its record
        UnknownWireType,    // a field the class does not have comes with wire type 6 or 7
        UnmatchedEndGroup,  // a skipped group is closed by another field's end-of-group key
        UnterminatedGroup,  // a skipped group runs to the end of its record without its end
    };

    constexpr DecodeError(Reason reason, std::size_t offset) : reason_(reason), offset_(offset) {}

    [[nodiscard]] constexpr Reason reason() const { return reason_; }
    [[nodiscard]] constexpr std::size_t offset() const { return offset_; }

    // The reason in words, e.g. "truncated varint".
    [[nodiscard]] static std::string_view describe(Reason reason);
    // The reason and where, e.g. "truncated varint at byte 12".
    [[nodiscard]] std::string text() const;

    friend constexpr bool operator==(const DecodeError&, const DecodeError&) = default;

  private:
    Reason reason_;
    std::size_t offset_;
};

}  // namespace pyx
