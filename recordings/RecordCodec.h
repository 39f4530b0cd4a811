// How one event object is kept in a recording: the metric ID and the payload bytes of a
// record go to columns of their own (so that SQL can count kinds and filter), everything else
// (other keys, their order, the exact kind of every value) to a compact binary form of the
// value, in which the two column values are marked where they stood. Reading puts back the
// very same value.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <stdexcept>
#include <vector>

#include "core/Value.h"

namespace pyx::recordings {

// A stored form that does not read back (a damaged file): what() says what is wrong.
class RecordCodecError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

struct EncodedRecord {
    // kKeyMetricID when it is an integer that fits in 64 signed bits.
    std::optional<std::int64_t> metricID;
    // kKeyPayload when it is bytes; points into the value that was encoded.
    const Bytes* payload = nullptr;
    // The rest, with markers where the two above stood.
    std::vector<std::uint8_t> form;
};

// Fills out (its buffers are reused from one call to the next).
void encodeRecord(const Value& object, EncodedRecord& out);

// The value that was encoded; metricID and payload are the column values (absent for NULL).
// Throws RecordCodecError.
[[nodiscard]] Value decodeRecord(std::span<const std::uint8_t> form,
                                 std::optional<std::int64_t> metricID,
                                 std::optional<std::span<const std::uint8_t>> payload);

}  // namespace pyx::recordings
