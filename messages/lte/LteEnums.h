// Enumerations of the LTE messages: named constants and name tables.
#pragma once

#include <cstdint>

#include "messages/EnumTable.h"

// The LTE RRC state (state, prev_state, rrc_state).
// clang-format off
#define PYX_ENUM_LteRrcState(E)                \
    E(0, KLTE_RRC_STATE_NULL)                  \
    E(1, KLTE_RRC_STATE_IDLE)                  \
    E(2, KLTE_RRC_STATE_ATMPT_CONNECTION)      \
    E(3, KLTE_RRC_STATE_CONNECTED)             \
    E(4, KLTE_RRC_STATE_ENDING)                \
    E(5, KLTE_RRC_STATE_ATMPT_OUTBND_MOBILITY) \
    E(6, KLTE_RRC_STATE_ATMPT_INBND_MOBILITY)
// clang-format on

// The LTE RRC establishment/release cause.
// clang-format off
#define PYX_ENUM_LteRrcCause(E)                         \
    E(0, KLTE_RRC_CAUSE_EST_EMERGENCY)                  \
    E(1, KLTE_RRC_CAUSE_EST_HIGH_PRIO_ACC)              \
    E(2, KLTE_RRC_CAUSE_EST_MT_ACC)                     \
    E(3, KLTE_RRC_CAUSE_EST_MO_SIGNAL)                  \
    E(4, KLTE_RRC_CAUSE_EST_MO_DATA)                    \
    E(5, KLTE_RRC_CAUSE_EST_DELAY_TOL_ACC)              \
    E(6, KLTE_RRC_CAUSE_REEST_RECFG_FAIL)               \
    E(7, KLTE_RRC_CAUSE_REEST_HO_FAIL)                  \
    E(8, KLTE_RRC_CAUSE_REEST_OTHER_FAIL)               \
    E(9, KLTE_RRC_CAUSE_REL_OTHER_RECFG_FAIL)           \
    E(10, KLTE_RRC_CAUSE_REL_CONN_FAIL_IRAT_RESEL)      \
    E(11, KLTE_RRC_CAUSE_REL_CONN_FAIL_T311_EXP)        \
    E(12, KLTE_RRC_CAUSE_REL_CONN_FAIL_CELL_NOT_SUIT)   \
    E(13, KLTE_RRC_CAUSE_REL_CONN_FAIL_REEST_REJ)       \
    E(14, KLTE_RRC_CAUSE_REL_LOAD_BAL_TAU_REQD)         \
    E(15, KLTE_RRC_CAUSE_REL_OTHER)                     \
    E(16, KLTE_RRC_CAUSE_REL_CSFB_HIGH_PRIO)            \
    E(17, KLTE_RRC_CAUSE_REL_T310_EXP)                  \
    E(18, KLTE_RRC_CAUSE_REL_RND_ACC)                   \
    E(19, KLTE_RRC_CAUSE_REL_MAX_RLC_RETRANS)           \
    E(20, KLTE_RRC_CAUSE_REL_SUCC_MOB_FROM_EUTRAN)      \
    E(21, KLTE_RRC_CAUSE_EST_SUCC_MOB_TO_EUTRAN)        \
    E(22, KLTE_RRC_CAUSE_EST_FAIL_NO_RESP_FROM_CELL)    \
    E(23, KLTE_RRC_CAUSE_EST_FAIL_REJ)                  \
    E(24, KLTE_RRC_CAUSE_EST_FAIL_CELL_RESEL)           \
    E(25, KLTE_RRC_CAUSE_EST_FAIL_ABORTED)              \
    E(26, KLTE_RRC_CAUSE_EST_FAIL_CELL_BARRED)          \
    E(27, KLTE_RRC_CAUSE_REEST_OTHER_FAIL_T310_EXP)     \
    E(28, KLTE_RRC_CAUSE_REEST_OTHER_FAIL_RND_ACC)      \
    E(29, KLTE_RRC_CAUSE_REEST_OTHER_FAIL_MAX_RLC_RETX) \
    E(30, KLTE_RRC_CAUSE_REEST_OTHER_FAIL_INTEG_CHECK)  \
    E(254, KLTE_RRC_CAUSE_NO_SERVICE)                   \
    E(255, KLTE_RRC_CAUSE_NA)
// clang-format on

// The frame type of an LTE neighbour frequency.
// clang-format off
#define PYX_ENUM_NbrEutraFrameType(E) \
    E(0, FDD)                         \
    E(1, TDD)                         \
    E(2, INVALID)
// clang-format on

// The state of a secondary component carrier.
// clang-format off
#define PYX_ENUM_SccState(E)               \
    E(0, SCC_STATE_DECONFIGURED)           \
    E(1, SCC_STATE_CONFIGURED_DEACTIVATED) \
    E(2, SCC_STATE_ACTIVATED)
// clang-format on

namespace pyx {

PYX_DECLARE_ENUM(LteRrcState)
PYX_DECLARE_ENUM(LteRrcCause)
PYX_DECLARE_ENUM(NbrEutraFrameType)
PYX_DECLARE_ENUM(SccState)

}  // namespace pyx
