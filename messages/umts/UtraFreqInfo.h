// Priority of one UTRA frequency.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_UtraFreqInfo(F)       \
    F##_U32(1, "uarfcn", uarfcn, Uarfcn) \
    F##_U32(2, "prio", prio, Prio)
// clang-format on

namespace pyx {

class UtraFreqInfo {
    PYX_MESSAGE_BODY(UtraFreqInfo)
};

}  // namespace pyx
