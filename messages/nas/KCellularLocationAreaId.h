// A location area identity.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_KCellularLocationAreaId(F)              \
    F##_BYTES(1, "encoded_plmn", encodedPlmn, EncodedPlmn) \
    F##_U32(2, "lac", lac, Lac)
// clang-format on

namespace pyx {

class KCellularLocationAreaId {
    PYX_MESSAGE_BODY(KCellularLocationAreaId)
};

}  // namespace pyx
