// LTE RRC state: current and previous state, time in the previous state, cause.
#pragma once

#include "messages/Message.h"
#include "messages/lte/LteEnums.h"

// clang-format off
#define PYX_FIELDS_KCellularLteRrcState(F)                          \
    F##_U64(1, "timestamp", timestamp, Timestamp)                   \
    F##_ENUM(2, "state", state, State, LteRrcState)                 \
    F##_ENUM(3, "prev_state", prevState, PrevState, LteRrcState)    \
    F##_U32(4, "prev_state_dur_ms", prevStateDurMs, PrevStateDurMs) \
    F##_ENUM(5, "cause", cause, Cause, LteRrcCause)
// clang-format on

namespace pyx {

class KCellularLteRrcState {
    PYX_MESSAGE_BODY(KCellularLteRrcState)
};

}  // namespace pyx
