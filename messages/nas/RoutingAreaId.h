// A routing area identity.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_RoutingAreaId(F)                        \
    F##_BYTES(1, "encoded_plmn", encodedPlmn, EncodedPlmn) \
    F##_U32(3, "lac", lac, Lac)                            \
    F##_U32(4, "rac", rac, Rac)
// clang-format on

namespace pyx {

class RoutingAreaId {
    PYX_MESSAGE_BODY(RoutingAreaId)
};

}  // namespace pyx
