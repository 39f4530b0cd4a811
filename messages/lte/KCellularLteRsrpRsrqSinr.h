// LTE RSRP/RSRQ/SINR statistics: averaged and instantaneous values.
#pragma once

#include "messages/Message.h"
#include "messages/lte/RsrpRsrqSinr.h"

// clang-format off
#define PYX_FIELDS_KCellularLteRsrpRsrqSinr(F)                                              \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                           \
    F##_STRING(3, "call_id", callId, CallId)                                                \
    F##_U32(6, "last_x_seconds", lastXSeconds, LastXSeconds)                                \
    F##_U32(7, "last_y_samples", lastYSamples, LastYSamples)                                \
    F##_U32(8, "sample_period_ms", samplePeriodMs, SamplePeriodMs)                          \
    F##_U32(10, "duration_ms", durationMs, DurationMs)                                      \
    F##_U32(11, "num_samples", numSamples, NumSamples)                                      \
    F##_MSG(14, "avg_values", avgValues, AvgValues, RsrpRsrqSinr)                           \
    F##_MSGS(15, "inst_values", instValues, InstValues, instValue, InstValue, RsrpRsrqSinr)
// clang-format on

namespace pyx {

class KCellularLteRsrpRsrqSinr {
    PYX_MESSAGE_BODY(KCellularLteRsrpRsrqSinr)
};

}  // namespace pyx
