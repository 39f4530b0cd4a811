// One LTE neighbour measured from WCDMA.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_LteCellMeasResult(F)             \
    F##_U32(1, "earfcn", earfcn, Earfcn)            \
    F##_U32(2, "phy_cell_id", phyCellId, PhyCellId) \
    F##_U32(3, "eutra_band", eutraBand, EutraBand)  \
    F##_S32(4, "rsrp", rsrp, Rsrp)                  \
    F##_S32(5, "rsrq", rsrq, Rsrq)
// clang-format on

namespace pyx {

class LteCellMeasResult {
    PYX_MESSAGE_BODY(LteCellMeasResult)
};

}  // namespace pyx
