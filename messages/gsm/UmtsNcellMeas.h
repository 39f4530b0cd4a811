// One UMTS neighbour cell of the GRR report.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_UmtsNcellMeas(F)                \
    F##_U32(1, "cell_type", cellType, CellType)    \
    F##_U32(2, "cpich_sc", cpichSc, CpichSc)       \
    F##_U32(3, "dl_uarfcn", dlUarfcn, DlUarfcn)    \
    F##_U32(4, "cpich_rscp", cpichRscp, CpichRscp) \
    F##_U32(5, "cpich_ecn0", cpichEcn0, CpichEcn0)
// clang-format on

namespace pyx {

class UmtsNcellMeas {
    PYX_MESSAGE_BODY(UmtsNcellMeas)
};

}  // namespace pyx
