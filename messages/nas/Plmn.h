// A PLMN identity as raw bytes.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_Plmn(F)                                 \
    F##_BYTES(1, "encoded_plmn", encodedPlmn, EncodedPlmn)
// clang-format on

namespace pyx {

class Plmn {
    PYX_MESSAGE_BODY(Plmn)
};

}  // namespace pyx
