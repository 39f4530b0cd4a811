// Enumerations of the UMTS (WCDMA) messages: named constants and name tables.
#pragma once

#include <cstdint>

#include "messages/EnumTable.h"
#include "messages/gsm/GsmEnums.h"
#include "messages/lte/LteEnums.h"

// The WCDMA RRC connection state.
// clang-format off
#define PYX_ENUM_WcdmaRrcConnState(E)              \
    E(0, KWCDMA_RRC_CONN_STATE_INVALID)            \
    E(1, KWCDMA_RRC_CONN_STATE_INACTIVE)           \
    E(2, KWCDMA_RRC_CONN_STATE_IDLE)               \
    E(3, KWCDMA_RRC_CONN_STATE_ESTABLISH)          \
    E(4, KWCDMA_RRC_CONN_STATE_URA_PCH)            \
    E(5, KWCDMA_RRC_CONN_STATE_CELL_PCH)           \
    E(6, KWCDMA_RRC_CONN_STATE_CELL_FACH)          \
    E(7, KWCDMA_RRC_CONN_STATE_CELL_DCH)           \
    E(8, KWCDMA_RRC_CONN_STATE_RELEASE)            \
    E(9, KWCDMA_RRC_CONN_STATE_RADIO_LINK_FAILURE) \
    E(10, KWCDMA_RRC_CONN_STATE_SCRI_SENT)
// clang-format on

// The WCDMA RRC establishment cause.
// clang-format off
#define PYX_ENUM_RrcEstablishmentCause(E)       \
    E(0, KRRC_EST_ORIG_CONV_CALL)               \
    E(1, KRRC_EST_ORIG_STREAM_CALL)             \
    E(2, KRRC_EST_ORIG_INTERACT_CALL)           \
    E(3, KRRC_EST_ORIG_BACKGND_CALL)            \
    E(4, KRRC_EST_ORIG_SUBSCRIBED_TRF_CALL)     \
    E(5, KRRC_EST_TERM_CONV_CALL)               \
    E(6, KRRC_EST_TERM_STREAM_CALL)             \
    E(7, KRRC_EST_TERM_INTERACT_CALL)           \
    E(8, KRRC_EST_TERM_BACKGND_CALL)            \
    E(9, KRRC_EST_EMERGENCY_CALL)               \
    E(10, KRRC_EST_INTER_RAT_CELL_RESELECT)     \
    E(11, KRRC_EST_INTER_RAT_CELL_CHANGE_ORDER) \
    E(12, KRRC_EST_REGISTRATION)                \
    E(13, KRRC_EST_DETACH)                      \
    E(14, KRRC_EST_HI_PRI_SIGNALLING)           \
    E(15, KRRC_EST_LOW_PRI_SIGNALLING)          \
    E(16, KRRC_EST_CALL_RE_ESTABLISH)           \
    E(17, KRRC_EST_TERM_HI_SIGNALLING)          \
    E(18, KRRC_EST_TERM_LOW_SIGNALLING)         \
    E(19, KRRC_EST_TERM_UNKNOWN)                \
    E(20, KRRC_EST_MBMS_RECEPTION)              \
    E(21, KRRC_EST_MBMS_PTP_RB_REQUEST)         \
    E(22, KRRC_EST_DELAY_TOLERANT_ACCESS)
// clang-format on

// The WCDMA RRC release cause.
// clang-format off
#define PYX_ENUM_RrcReleaseCause(E)                     \
    E(0, KRRC_REL_OTHER_CAUSE)                          \
    E(1, KRRC_REL_NO_CAUSE)                             \
    E(2, KRRC_REL_NO_CELL)                              \
    E(3, KRRC_REL_INACTIVE)                             \
    E(4, KRRC_REL_NORMAL_EVENT)                         \
    E(5, KRRC_REL_CELL_BARRED)                          \
    E(6, KRRC_REL_CELL_CHANGED)                         \
    E(7, KRRC_REL_ACCESS_NOT_ALLOWED)                   \
    E(8, KRRC_REL_RRC_CONN_ESTABLISHMENT_FAILURE)       \
    E(9, KRRC_REL_RELEASE_OOSA)                         \
    E(10, KRRC_REL_SIGN_CONN_REL)                       \
    E(11, KRRC_REL_CONN_REJECT_REDIRECTION)             \
    E(12, KRRC_REL_NAS_TRIGGERED_ABORT)                 \
    E(13, KRRC_REL_CONN_REL_LOWER_LAYER_FAILURE_DL)     \
    E(14, KRRC_REL_CONN_REL_LOWER_LAYER_FAILURE_UL)     \
    E(15, KRRC_REL_HO_FROM_UTRAN_REVERT_BACK_SYNC_FAIL) \
    E(16, KRRC_REL_CONN_REJECT_CONGESTION)              \
    E(17, KRRC_REL_CONN_REJECT_UNSPECIFIED)
// clang-format on

// The HSPA capability of a WCDMA cell.
// clang-format off
#define PYX_ENUM_SysHsInd(E)                 \
    E(0, SYS_HS_IND_HSDPA_HSUPA_UNSUPP_CELL) \
    E(1, SYS_HS_IND_HSDPA_SUPP_CELL)         \
    E(2, SYS_HS_IND_HSUPA_SUPP_CELL)         \
    E(3, SYS_HS_IND_HSDPA_HSUPA_SUPP_CELL)
// clang-format on

// The duplex mode of a WCDMA cell (names only: FDD and TDD are the frame-type constants).
// clang-format off
#define PYX_ENUM_WcdmaDuplexMode(E) \
    E(0, FDD)                       \
    E(1, TDD)
// clang-format on

namespace pyx {

PYX_DECLARE_ENUM(WcdmaRrcConnState)
PYX_DECLARE_ENUM(RrcEstablishmentCause)
PYX_DECLARE_ENUM(RrcReleaseCause)
PYX_DECLARE_ENUM(SysHsInd)
PYX_DECLARE_ENUM_NAMES(WcdmaDuplexMode)

}  // namespace pyx
