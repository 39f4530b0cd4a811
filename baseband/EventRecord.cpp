#include "baseband/EventRecord.h"

#include <utility>

namespace pyx {

MetricRecord metricRecordFromEvent(const Value& event) {
    return event.isDict() ? event.asDict() : MetricRecord{};
}

MetricRecord metricRecordFromEvent(Value&& event) {
    return event.isDict() ? std::move(event.asDict()) : MetricRecord{};
}

}  // namespace pyx
