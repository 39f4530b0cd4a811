// GSM serving cell identity.
#pragma once

#include "messages/Message.h"
#include "messages/gsm/GsmEnums.h"

// clang-format off
#define PYX_FIELDS_KCellularGsmScellInfo(F)                   \
    F##_U64(1, "timestamp", timestamp, Timestamp)             \
    F##_U32(4, "mcc", mcc, Mcc)                               \
    F##_U32(5, "mnc", mnc, Mnc)                               \
    F##_U32(6, "lac", lac, Lac)                               \
    F##_U32(7, "cell_id", cellId, CellId)                     \
    F##_ENUM(8, "gsm_band", gsmBand, GsmBand, SysBand)        \
    F##_U32(9, "arfcn", arfcn, Arfcn)                         \
    F##_U32(10, "bsic", bsic, Bsic)                           \
    F##_ENUM(11, "state", state, State, GsmScellState)        \
    F##_U32(13, "num_mnc_digits", numMncDigits, NumMncDigits)
// clang-format on

namespace pyx {

class KCellularGsmScellInfo {
    PYX_MESSAGE_BODY(KCellularGsmScellInfo)
};

}  // namespace pyx
