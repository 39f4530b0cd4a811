// One GSM neighbour measured from WCDMA.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_GsmCellMeasResult(F) \
    F##_U32(1, "arfcn", arfcn, Arfcn)   \
    F##_U32(2, "bsic", bsic, Bsic)      \
    F##_U32(3, "rxlev", rxlev, Rxlev)
// clang-format on

namespace pyx {

class GsmCellMeasResult {
    PYX_MESSAGE_BODY(GsmCellMeasResult)
};

}  // namespace pyx
