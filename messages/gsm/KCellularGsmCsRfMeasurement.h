// GSM circuit-switched RF measurement.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_KCellularGsmCsRfMeasurement(F)                           \
    F##_U64(1, "timestamp", timestamp, Timestamp)                           \
    F##_U32(2, "scell_arfcn", scellArfcn, ScellArfcn)                       \
    F##_U32(3, "simplified_l1_state", simplifiedL1State, SimplifiedL1State) \
    F##_U32(4, "current_antenna", currentAntenna, CurrentAntenna)           \
    F##_S32S(5, "cs_tx_pwr", csTxPwrs, CsTxPwrs, csTxPwr, CsTxPwr)          \
    F##_U32(6, "cs_rxlev_sub", csRxlevSub, CsRxlevSub)                      \
    F##_U32(7, "cs_rxqual_sub", csRxqualSub, CsRxqualSub)                   \
    F##_U32(8, "scell_band", scellBand, ScellBand)
// clang-format on

namespace pyx {

class KCellularGsmCsRfMeasurement {
    PYX_MESSAGE_BODY(KCellularGsmCsRfMeasurement)
};

}  // namespace pyx
