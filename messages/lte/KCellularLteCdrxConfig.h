// LTE connected-mode DRX configuration.
#pragma once

#include "messages/Message.h"
#include "messages/lte/LteEnums.h"

// clang-format off
#define PYX_FIELDS_KCellularLteCdrxConfig(F)                               \
    F##_U64(1, "timestamp", timestamp, Timestamp)                          \
    F##_U32(2, "cell_status", cellStatus, CellStatus)                      \
    F##_U32(3, "on_duration_ms", onDurationMs, OnDurationMs)               \
    F##_U32(4, "drx_inactivity_ms", drxInactivityMs, DrxInactivityMs)      \
    F##_U32(5, "drx_retx_timer_ms", drxRetxTimerMs, DrxRetxTimerMs)        \
    F##_U32(7, "long_drx_cycle_ms", longDrxCycleMs, LongDrxCycleMs)        \
    F##_U32(10, "short_drx_cycle_ms", shortDrxCycleMs, ShortDrxCycleMs)    \
    F##_U32(11, "drx_short_cycle_num", drxShortCycleNum, DrxShortCycleNum) \
    F##_ENUM(12, "rrc_state", rrcState, RrcState, LteRrcState)             \
    F##_U32(13, "cdrx_config_status", cdrxConfigStatus, CdrxConfigStatus)  \
    F##_U32(14, "transmission_mode", transmissionMode, TransmissionMode)
// clang-format on

namespace pyx {

class KCellularLteCdrxConfig {
    PYX_MESSAGE_BODY(KCellularLteCdrxConfig)
};

}  // namespace pyx
