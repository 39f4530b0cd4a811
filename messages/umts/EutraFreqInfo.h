// Priority of one E-UTRA frequency.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_EutraFreqInfo(F)      \
    F##_U32(1, "earfcn", earfcn, Earfcn) \
    F##_U32(2, "prio", prio, Prio)
// clang-format on

namespace pyx {

class EutraFreqInfo {
    PYX_MESSAGE_BODY(EutraFreqInfo)
};

}  // namespace pyx
