// The input cursor of the wire decoder: bytes, a length (the end of the record being read), a
// position and a sticky failure (the first DecodeError met). Each wire type's reading is here,
// written once: varints, length-delimited values (also as a reader of their own, for nested
// records and packed lists), fixed-width values and groups (skipped).
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string>

#include "core/Value.h"
#include "messages/DecodeError.h"
#include "messages/WireType.h"

namespace pyx {

class PBDataReader {
  public:
    explicit PBDataReader(std::span<const std::uint8_t> data)
        : bytes_(data.data()), length_(data.size()) {}
    // The reader only views its bytes: a temporary buffer would be gone before the reading.
    explicit PBDataReader(Bytes&&) = delete;

    [[nodiscard]] const std::uint8_t* bytes() const { return bytes_; }
    // The end of the record this reader reads.
    [[nodiscard]] std::size_t length() const { return length_; }
    [[nodiscard]] std::size_t position() const { return pos_; }
    [[nodiscard]] bool hasError() const { return error_.has_value(); }
    [[nodiscard]] bool hasMoreData() const { return pos_ < length_ && !error_; }
    [[nodiscard]] std::size_t remaining() const { return length_ - pos_; }
    // The first failure, if any; its offset counts from the start of the outermost payload.
    [[nodiscard]] const std::optional<DecodeError>& error() const { return error_; }

    // Records a failure of the item whose first byte is at position (of this reader); a
    // failure already recorded is kept.
    void fail(DecodeError::Reason reason, std::size_t position) {
        if (!error_) error_ = DecodeError(reason, origin_ + position);
    }

    // A base-128 varint, least significant group first. Reading past the end records a
    // truncated varint and gives 0; ten bytes without a final byte give 0 (the ten are
    // consumed).
    std::uint64_t readVarint();

    // For a decoder that keeps the position in a local while it reads plain values.
    void setPosition(std::size_t position) { pos_ = position; }

    // A length-delimited value: its length, then that many bytes, which are passed over.
    // Nothing, with the failure recorded, when the length cannot be read or runs past the end.
    inline std::optional<std::span<const std::uint8_t>> readDelimited();

    // A reader over bytes this reader holds (a value from readDelimited): a nested record or a
    // packed list is read by a reader of its own, whose failures keep the payload's offsets.
    [[nodiscard]] PBDataReader subReader(std::span<const std::uint8_t> range) const {
        PBDataReader sub(range);
        sub.origin_ = origin_ + static_cast<std::size_t>(range.data() - bytes_);
        return sub;
    }
    // A reader for the nested record [begin, end) of this reader's record, on the same bytes:
    // its positions and failures count from the same first byte, so that resumeAfter takes it
    // back as it takes a sub-reader. For a reader that has no failure.
    // (Built field by field: a copy of the whole reader would load its position right after
    // the caller stored it, and stall on the store.)
    [[nodiscard]] PBDataReader record(std::size_t begin, std::size_t end) const {
        return PBDataReader(bytes_, end, begin, origin_);
    }
    // Takes back a finished sub-reader: reading goes on from where it stopped (the end of its
    // range, or earlier at an end-of-group key), and its failure becomes this reader's.
    void resumeAfter(const PBDataReader& sub) {
        pos_ = static_cast<std::size_t>(sub.bytes_ - bytes_) + sub.pos_;
        if (sub.error_ && !error_) error_ = sub.error_;
    }

  private:
    PBDataReader(const std::uint8_t* bytes, std::size_t length, std::size_t pos, std::size_t origin)
        : bytes_(bytes), length_(length), pos_(pos), origin_(origin) {}

    const std::uint8_t* bytes_;
    std::size_t length_;
    std::size_t pos_ = 0;
    std::size_t origin_ = 0;  // where bytes_[0] is in the outermost payload
    std::optional<DecodeError> error_;
};

// A varint of three bytes or more, or one that runs past the end, read from `available` bytes
// at p: its value and its length in bytes (0 when it runs past the end; ten bytes without a
// final byte give the value 0). Out of line, and it takes no reference: a caller's position
// stays in a register.
struct VarintTail {
    std::uint64_t value;
    std::size_t size;
};
VarintTail decodeVarintTail(const std::uint8_t* p, std::size_t available);

// The varint decoder behind PBDataReader::readVarint, on a position and limit held by the
// caller. A varint that runs past the limit sets error, gives 0 and leaves pos at its first
// byte (where the failure is reported). One- and two-byte values (keys, most field values)
// take no loop.
inline std::uint64_t decodeVarint(const std::uint8_t* bytes, std::size_t& pos, std::size_t limit,
                                  bool& error) {
    if (limit - pos >= 2) {
        const std::uint8_t b0 = bytes[pos];
        if (b0 < 0x80) {
            ++pos;
            return b0;
        }
        const std::uint8_t b1 = bytes[pos + 1];
        if (b1 < 0x80) {
            pos += 2;
            return (b0 & 0x7FU) | (static_cast<std::uint64_t>(b1) << 7);
        }
    } else if (pos < limit && bytes[pos] < 0x80) {
        return bytes[pos++];
    }
    const VarintTail tail = decodeVarintTail(bytes + pos, limit - pos);
    if (tail.size == 0) {
        error = true;
        return 0;
    }
    pos += tail.size;
    return tail.value;
}

inline std::uint64_t PBDataReader::readVarint() {
    bool truncated = false;
    const std::uint64_t value = decodeVarint(bytes_, pos_, length_, truncated);
    if (truncated) fail(DecodeError::Reason::TruncatedVarint, pos_);
    return value;
}

inline std::optional<std::span<const std::uint8_t>> PBDataReader::readDelimited() {
    const std::size_t start = pos_;
    const std::uint64_t size = readVarint();
    if (error_) return std::nullopt;
    if (size > remaining()) {
        fail(DecodeError::Reason::LengthPastEnd, start);
        return std::nullopt;
    }
    const std::span<const std::uint8_t> value(bytes_ + pos_, static_cast<std::size_t>(size));
    pos_ += value.size();
    return value;
}

// A length-delimited value as bytes; nothing (failure recorded) when it runs past the end.
std::optional<Bytes> PBReaderReadData(PBDataReader& reader);
// A length-delimited value as UTF-8 text; nothing when it runs past the end (failure recorded)
// or is not valid UTF-8 (no failure: the field is simply absent, as an undecodable text is).
std::optional<std::string> PBReaderReadString(PBDataReader& reader);

// Skips one value of the given wire type, whose key began at keyPosition (a group up to its
// matching end). False, with the failure recorded, for an unknown wire type, an unmatched end
// of group, a group without its end or a value running past the end.
bool PBReaderSkipValueWithTag(PBDataReader& reader, std::uint32_t tag, std::uint8_t wireType,
                              std::size_t keyPosition);

// Zigzag decoding of a 32-bit value.
constexpr std::int32_t decodeZigZag32(std::uint32_t n) {
    return static_cast<std::int32_t>((n >> 1) ^ (~(n & 1) + 1));
}

}  // namespace pyx
