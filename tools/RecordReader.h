// One JSON Lines record read into the MetricRecord that the baseband client would hand to the
// store: {"kKeyMetricID": 3986178, "kKeyPayload": "0a08..."}. The payload is hex digits
// (either case) and becomes bytes; other keys are ignored.
#pragma once

#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

#include "baseband/MetricRecord.h"

namespace pyx {

// A line that is not a record: not JSON, not an object, a payload that is not hex digits.
// Carries the metric ID when the line had an integer one.
class RecordError : public std::runtime_error {
  public:
    RecordError(std::optional<std::int64_t> metricID, std::string reason);
    [[nodiscard]] const std::optional<std::int64_t>& metricID() const { return metricID_; }
    [[nodiscard]] const std::string& reason() const { return reason_; }

  private:
    std::optional<std::int64_t> metricID_;
    std::string reason_;
};

// The record of one line. The metric ID is passed on as it came (a number, a text, ...), so
// that the store itself judges it; a missing payload stays missing. Throws RecordError.
[[nodiscard]] MetricRecord readRecord(std::string_view line);

// Bytes from hex digits (either case, even count); nothing for anything else.
[[nodiscard]] std::optional<Bytes> bytesFromHex(std::string_view hex);

}  // namespace pyx
