// One LTE neighbour cell of the GRR report.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_LteNcellMeas(F)                                 \
    F##_U32(1, "physical_cell_id", physicalCellId, PhysicalCellId) \
    F##_U32(2, "bandwidth", bandwidth, Bandwidth)                  \
    F##_U32(3, "rsrp", rsrp, Rsrp)                                 \
    F##_U32(4, "earfcn", earfcn, Earfcn)                           \
    F##_U32(5, "rsrq", rsrq, Rsrq)
// clang-format on

namespace pyx {

class LteNcellMeas {
    PYX_MESSAGE_BODY(LteNcellMeas)
};

}  // namespace pyx
