// A tracking area identity.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_KCellularTrackingAreaId(F)              \
    F##_BYTES(1, "encoded_plmn", encodedPlmn, EncodedPlmn) \
    F##_U32(2, "tac", tac, Tac)
// clang-format on

namespace pyx {

class KCellularTrackingAreaId {
    PYX_MESSAGE_BODY(KCellularTrackingAreaId)
};

}  // namespace pyx
