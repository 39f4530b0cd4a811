// One UTRA neighbour measured from WCDMA.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_UtraCellMeasResult(F) \
    F##_U32(1, "uarfcn", uarfcn, Uarfcn) \
    F##_U32(2, "band", band, Band)       \
    F##_U32(3, "psc", psc, Psc)          \
    F##_U32(4, "ecno", ecno, Ecno)       \
    F##_S32(5, "rscp", rscp, Rscp)
// clang-format on

namespace pyx {

class UtraCellMeasResult {
    PYX_MESSAGE_BODY(UtraCellMeasResult)
};

}  // namespace pyx
