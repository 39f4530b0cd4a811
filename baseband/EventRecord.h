// The conversion of a baseband event object into the MetricRecord handed to the delegate.
#pragma once

#include "baseband/MetricRecord.h"
#include "core/Value.h"

namespace pyx {

// A dictionary event becomes the record with the same keys and values, in the same order;
// anything else (null, a bare number, ...) becomes an empty record.
[[nodiscard]] MetricRecord metricRecordFromEvent(const Value& event);
[[nodiscard]] MetricRecord metricRecordFromEvent(Value&& event);

}  // namespace pyx
