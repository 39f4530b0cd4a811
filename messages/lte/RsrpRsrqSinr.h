// RSRP, RSRQ and SINR of two receive chains for one cell.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_RsrpRsrqSinr(F)                  \
    F##_U32(1, "phy_cell_id", phyCellId, PhyCellId) \
    F##_S32(4, "rsrp0", rsrp0, Rsrp0)               \
    F##_S32(5, "rsrp1", rsrp1, Rsrp1)               \
    F##_S32(7, "rsrq0", rsrq0, Rsrq0)               \
    F##_S32(8, "rsrq1", rsrq1, Rsrq1)               \
    F##_S32(10, "sinr0", sinr0, Sinr0)              \
    F##_S32(11, "sinr1", sinr1, Sinr1)
// clang-format on

namespace pyx {

class RsrpRsrqSinr {
    PYX_MESSAGE_BODY(RsrpRsrqSinr)
};

}  // namespace pyx
