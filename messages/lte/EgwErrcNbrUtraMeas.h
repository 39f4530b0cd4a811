// One UTRA neighbour cell measured from LTE.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_EgwErrcNbrUtraMeas(F) \
    F##_U32(1, "uarfcn", uarfcn, Uarfcn) \
    F##_U32(2, "psc", psc, Psc)          \
    F##_S32(3, "rscp", rscp, Rscp)       \
    F##_U32(4, "ecno", ecno, Ecno)
// clang-format on

namespace pyx {

class EgwErrcNbrUtraMeas {
    PYX_MESSAGE_BODY(EgwErrcNbrUtraMeas)
};

}  // namespace pyx
