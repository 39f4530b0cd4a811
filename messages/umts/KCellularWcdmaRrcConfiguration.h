// WCDMA RRC configuration.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_KCellularWcdmaRrcConfiguration(F)                      \
    F##_U64(1, "timestamp", timestamp, Timestamp)                         \
    F##_U32(2, "drx_cycle_length_ms", drxCycleLengthMs, DrxCycleLengthMs) \
    F##_BOOL(3, "is_mimo_configured", isMimoConfigured, IsMimoConfigured) \
    F##_BOOL(4, "is_dc_configured", isDcConfigured, IsDcConfigured)
// clang-format on

namespace pyx {

class KCellularWcdmaRrcConfiguration {
    PYX_MESSAGE_BODY(KCellularWcdmaRrcConfiguration)
};

}  // namespace pyx
