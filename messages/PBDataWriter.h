// The output buffer of the wire encoder and the field writers. Each writer emits the key
// (field number and wire type) and then the value; the tag kNoTag writes the value alone.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

#include "core/Value.h"
#include "messages/WireType.h"

namespace pyx {

class PBDataWriter {
  public:
    PBDataWriter() = default;

    [[nodiscard]] const Bytes& data() const { return buffer_; }
    [[nodiscard]] Bytes takeData() { return std::move(buffer_); }
    [[nodiscard]] std::size_t size() const { return buffer_.size(); }

    void writeVarint(std::uint64_t value) {
        while (value >= 0x80) {
            buffer_.push_back(static_cast<std::uint8_t>(value | 0x80));
            value >>= 7;
        }
        buffer_.push_back(static_cast<std::uint8_t>(value));
    }
    void writeBytes(const std::uint8_t* data, std::size_t size) {
        buffer_.insert(buffer_.end(), data, data + size);
    }
    // Inserts bytes at an earlier offset (the length of a record closed by a mark).
    void insertVarintAt(std::size_t offset, std::uint64_t value);

  private:
    Bytes buffer_;
};

// The tag that writes a value without its key.
inline constexpr std::uint32_t kNoTag = 0xFFFFFFFF;

inline void PBDataWriterWriteKey(PBDataWriter& writer, std::uint32_t tag, WireType wireType) {
    if (tag != kNoTag) writer.writeVarint((static_cast<std::uint64_t>(tag) << 3) | wireType);
}

constexpr std::uint32_t encodeZigZag32(std::int32_t n) {
    return (static_cast<std::uint32_t>(n) << 1) ^ static_cast<std::uint32_t>(n >> 31);
}

inline void PBDataWriterWriteUint64Field(PBDataWriter& w, std::uint64_t value, std::uint32_t tag) {
    PBDataWriterWriteKey(w, tag, kWireVarint);
    w.writeVarint(value);
}
inline void PBDataWriterWriteUint32Field(PBDataWriter& w, std::uint32_t value, std::uint32_t tag) {
    PBDataWriterWriteKey(w, tag, kWireVarint);
    w.writeVarint(value);
}
// Negative values are written sign-extended to 64 bits (ten bytes).
inline void PBDataWriterWriteInt32Field(PBDataWriter& w, std::int32_t value, std::uint32_t tag) {
    PBDataWriterWriteKey(w, tag, kWireVarint);
    w.writeVarint(static_cast<std::uint64_t>(static_cast<std::int64_t>(value)));
}
inline void PBDataWriterWriteSint32Field(PBDataWriter& w, std::int32_t value, std::uint32_t tag) {
    PBDataWriterWriteKey(w, tag, kWireVarint);
    w.writeVarint(encodeZigZag32(value));
}
inline void PBDataWriterWriteBOOLField(PBDataWriter& w, bool value, std::uint32_t tag) {
    PBDataWriterWriteKey(w, tag, kWireVarint);
    w.writeVarint(value ? 1 : 0);
}
inline void PBDataWriterWriteDataField(PBDataWriter& w, const Bytes& value, std::uint32_t tag) {
    PBDataWriterWriteKey(w, tag, kWireLengthDelimited);
    w.writeVarint(value.size());
    w.writeBytes(value.data(), value.size());
}
inline void PBDataWriterWriteStringField(PBDataWriter& w, const std::string& value,
                                         std::uint32_t tag) {
    PBDataWriterWriteKey(w, tag, kWireLengthDelimited);
    w.writeVarint(value.size());
    w.writeBytes(reinterpret_cast<const std::uint8_t*>(value.data()), value.size());
}

// An open length-delimited record: where its contents begin.
struct PBDataWriterMark {
    std::size_t offset = 0;
};

// Writes the key of a length-delimited record with tag and remembers where its contents start.
inline void PBDataWriterPlaceMark(PBDataWriter& w, PBDataWriterMark& mark, std::uint32_t tag) {
    PBDataWriterWriteKey(w, tag, kWireLengthDelimited);
    mark.offset = w.size();
}
// Closes the record: puts the length of everything written since the mark in front of it.
inline void PBDataWriterRecallMark(PBDataWriter& w, const PBDataWriterMark& mark,
                                   std::uint32_t /*tag*/) {
    w.insertVarintAt(mark.offset, w.size() - mark.offset);
}

// Writes a message as a length-delimited record; Message is any message class.
template <class Message>
void PBDataWriterWriteSubmessage(PBDataWriter& w, const Message& message, std::uint32_t tag) {
    PBDataWriterMark mark;
    PBDataWriterPlaceMark(w, mark, tag);
    message.writeTo(w);
    PBDataWriterRecallMark(w, mark, tag);
}

}  // namespace pyx
