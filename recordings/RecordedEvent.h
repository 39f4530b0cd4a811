// One event as a recording holds it: the event object exactly as the client got it, which
// stream it came on, and when it arrived.
#pragma once

#include <cstdint>
#include <string>

#include "core/Value.h"

namespace pyx::recordings {

struct RecordedEvent {
    std::int64_t id = 0;       // position in the file, ascending in arrival order
    std::int64_t session = 0;  // the recording run it belongs to
    std::string stream;        // velk::kEventMetric or velk::kEventTrigger
    std::int64_t wallNs = 0;   // wall clock at arrival, ns since 1970
    std::int64_t monoNs = 0;   // monotonic clock at arrival, ns; comparable within a session
    Value object;
};

}  // namespace pyx::recordings
