// A globally unique temporary identity.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_Guti(F)             \
    F##_U32(1, "mmegi", mmegi, Mmegi)  \
    F##_U32(2, "mmec", mmec, Mmec)     \
    F##_U32(3, "m_tmsi", mTmsi, MTmsi)
// clang-format on

namespace pyx {

class Guti {
    PYX_MESSAGE_BODY(Guti)
};

}  // namespace pyx
