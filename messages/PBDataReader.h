// The input cursor of the wire decoder: bytes, a length (the current limit), a position and a
// sticky error flag, with the length-delimited value readers and the limit marks that nested
// records use.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string>

#include "core/Value.h"

namespace pyx {

class PBDataReader {
  public:
    explicit PBDataReader(std::span<const std::uint8_t> data)
        : bytes_(data.data()), length_(data.size()) {}
    // The reader only views its bytes: a temporary buffer would be gone before the reading.
    explicit PBDataReader(Bytes&&) = delete;

    [[nodiscard]] const std::uint8_t* bytes() const { return bytes_; }
    // The current limit: the end of the data, or of the nested record being read.
    [[nodiscard]] std::size_t length() const { return length_; }
    [[nodiscard]] std::size_t position() const { return pos_; }
    [[nodiscard]] bool hasError() const { return error_; }
    [[nodiscard]] bool hasMoreData() const { return pos_ < length_ && !error_; }
    [[nodiscard]] std::size_t remaining() const { return length_ - pos_; }

    void setError() { error_ = true; }

    // A base-128 varint, least significant group first. Reading past the limit sets the
    // error flag and gives 0; ten bytes without a final byte give 0 (the ten are consumed).
    std::uint64_t readVarint();

    // For a decoder that keeps the position in a local while it reads plain values.
    void setPosition(std::size_t position) { pos_ = position; }

    // Moves the position forward by n bytes; past the limit it sets the error flag instead.
    bool skip(std::size_t n);

    // The limit marks of nested records (used through PBReaderPlaceMark/PBReaderRecallMark).
    friend struct PBDataReaderAccess;

  private:
    std::uint64_t readVarintSlow();

    const std::uint8_t* bytes_;
    std::size_t length_;
    std::size_t pos_ = 0;
    bool error_ = false;
};

// The varint decoder behind PBDataReader::readVarint, on a position and limit held by the
// caller: one- and two-byte values (keys, most field values) take no loop.
std::uint64_t decodeVarintSlow(const std::uint8_t* bytes, std::size_t& pos, std::size_t limit,
                               bool& error);

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
    return decodeVarintSlow(bytes, pos, limit, error);
}

inline std::uint64_t PBDataReader::readVarint() {
    return decodeVarint(bytes_, pos_, length_, error_);
}

// The outer limit saved while a nested record is read.
struct PBDataReaderMark {
    std::size_t length = 0;
};

// Reads a length; when it fits before the limit, saves the limit in mark, sets the limit to the
// end of that many bytes and answers true. A length running past the limit answers false (and
// a length that could not be read sets the error flag).
bool PBReaderPlaceMark(PBDataReader& reader, PBDataReaderMark& mark);
// Restores the limit saved by PBReaderPlaceMark.
void PBReaderRecallMark(PBDataReader& reader, const PBDataReaderMark& mark);

// A length-delimited value as bytes; nothing (and the error flag) when it runs past the limit.
std::optional<Bytes> PBReaderReadData(PBDataReader& reader);
// A length-delimited value as UTF-8 text; nothing when it runs past the limit (error flag set)
// or is not valid UTF-8 (no error: the field is simply absent, as an undecodable text is).
std::optional<std::string> PBReaderReadString(PBDataReader& reader);

// Skips one value of the given wire type (a group up to its matching end). False for an
// unknown wire type, an unmatched end of group, or a value running past the limit.
bool PBReaderSkipValueWithTag(PBDataReader& reader, std::uint32_t tag, std::uint8_t wireType);

// Zigzag decoding of a 32-bit value.
constexpr std::int32_t decodeZigZag32(std::uint32_t n) {
    return static_cast<std::int32_t>((n >> 1) ^ (~(n & 1) + 1));
}

}  // namespace pyx
