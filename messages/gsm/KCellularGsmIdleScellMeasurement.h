// GSM idle serving cell measurement.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_KCellularGsmIdleScellMeasurement(F)                      \
    F##_U64(1, "timestamp", timestamp, Timestamp)                           \
    F##_U32(2, "scell_arfcn", scellArfcn, ScellArfcn)                       \
    F##_U32(3, "simplified_l1_state", simplifiedL1State, SimplifiedL1State) \
    F##_U32(4, "current_antenna", currentAntenna, CurrentAntenna)           \
    F##_S32(5, "idle_rxlev_dBm", idleRxlevDBm, IdleRxlevDBm)
// clang-format on

namespace pyx {

class KCellularGsmIdleScellMeasurement {
    PYX_MESSAGE_BODY(KCellularGsmIdleScellMeasurement)
};

}  // namespace pyx
