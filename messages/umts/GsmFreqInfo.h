// Priority of one GSM frequency.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_GsmFreqInfo(F)     \
    F##_U32(1, "arfcn", arfcn, Arfcn) \
    F##_U32(2, "prio", prio, Prio)
// clang-format on

namespace pyx {

class GsmFreqInfo {
    PYX_MESSAGE_BODY(GsmFreqInfo)
};

}  // namespace pyx
