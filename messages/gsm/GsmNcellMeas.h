// One GSM neighbour cell of the GRR report.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_GsmNcellMeas(F)    \
    F##_U32(1, "mcc", mcc, Mcc)       \
    F##_U32(2, "mnc", mnc, Mnc)       \
    F##_U32(3, "lac", lac, Lac)       \
    F##_U32(4, "ci", ci, Ci)          \
    F##_U32(5, "bsic", bsic, Bsic)    \
    F##_U32(6, "arfcn", arfcn, Arfcn) \
    F##_U32(7, "rxlev", rxlev, Rxlev)
// clang-format on

namespace pyx {

class GsmNcellMeas {
    PYX_MESSAGE_BODY(GsmNcellMeas)
};

}  // namespace pyx
