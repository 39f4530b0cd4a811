// WCDMA serving cell identity.
#pragma once

#include "messages/Message.h"
#include "messages/gsm/GsmEnums.h"
#include "messages/umts/UmtsEnums.h"

// clang-format off
#define PYX_FIELDS_KCellularWcdmaCellInfo(F)                  \
    F##_U64(1, "timestamp", timestamp, Timestamp)             \
    F##_U32(4, "mcc", mcc, Mcc)                               \
    F##_U32(5, "mnc", mnc, Mnc)                               \
    F##_U32(6, "lac", lac, Lac)                               \
    F##_U32(7, "cell_id", cellId, CellId)                     \
    F##_ENUM(8, "wcdma_band", wcdmaBand, WcdmaBand, SysBand)  \
    F##_U32(9, "dl_uarfcn", dlUarfcn, DlUarfcn)               \
    F##_U32(10, "psc", psc, Psc)                              \
    F##_U32(13, "num_mnc_digits", numMncDigits, NumMncDigits) \
    F##_ENUM(14, "hspa", hspa, Hspa, SysHsInd)
// clang-format on

namespace pyx {

class KCellularWcdmaCellInfo {
    PYX_MESSAGE_BODY(KCellularWcdmaCellInfo)
};

}  // namespace pyx
