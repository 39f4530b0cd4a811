// One MetricRecord as the JSON Lines record that pyxonctl decode and screen read:
// {"kKeyMetricID": 3986178, "kKeyPayload": "0a08...", ...}. The metric ID comes first and the
// payload (bytes as lowercase hex digits) second; the record's other keys follow in their own
// order, as their JSON forms.
#pragma once

#include <string>

#include "baseband/MetricRecord.h"

namespace pyx {

// The line, without its newline.
[[nodiscard]] std::string recordLine(const MetricRecord& record);

// The line's fields without the braces ("\"kKeyMetricID\": 3986178, ..."), appended to out;
// for lines that put fields of their own first.
void appendRecordFields(std::string& out, const MetricRecord& record);

}  // namespace pyx
