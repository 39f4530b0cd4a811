// Transmit power of one subframe (LTE and UMTS).
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_TxPowerInfo(F)                              \
    F##_S32(1, "pucch_tx_power", pucchTxPower, PucchTxPower)   \
    F##_S32(2, "pusch_tx_power", puschTxPower, PuschTxPower)   \
    F##_U32(3, "subframe_index", subframeIndex, SubframeIndex)
// clang-format on

namespace pyx {

class TxPowerInfo {
    PYX_MESSAGE_BODY(TxPowerInfo)
};

}  // namespace pyx
