// One GERAN neighbour cell measured from LTE.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_EgwErrcNbrGeranMeas(F) \
    F##_U32(1, "arfcn", arfcn, Arfcn)     \
    F##_U32(2, "bsic", bsic, Bsic)        \
    F##_U32(3, "rxlev", rxlev, Rxlev)
// clang-format on

namespace pyx {

class EgwErrcNbrGeranMeas {
    PYX_MESSAGE_BODY(EgwErrcNbrGeranMeas)
};

}  // namespace pyx
