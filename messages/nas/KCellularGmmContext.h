// GMM registration context.
#pragma once

#include "messages/Message.h"
#include "messages/nas/NasEnums.h"
#include "messages/nas/RoutingAreaId.h"

// clang-format off
#define PYX_FIELDS_KCellularGmmContext(F)                                                     \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                             \
    F##_ENUM(2, "reg_status", regStatus, RegStatus, RegStatus)                                \
    F##_ENUM(3, "update_status", updateStatus, UpdateStatus, GmmUpdateStatus)                 \
    F##_MSG(4, "rai", rai, Rai, RoutingAreaId)                                                \
    F##_U32(5, "p_tmsi", pTmsi, PTmsi)                                                        \
    F##_U32(6, "t3312_dur_s", t3312DurS, T3312DurS)                                           \
    F##_ENUM(7, "proc_failure_cause", procFailureCause, ProcFailureCause, MmProcFailureCause) \
    F##_ENUM(8, "reject_cause", rejectCause, RejectCause, MmRejectCause)                      \
    F##_ENUM(9, "reg_proc", regProc, RegProc, GmmRegProc)
// clang-format on

namespace pyx {

class KCellularGmmContext {
    PYX_MESSAGE_BODY(KCellularGmmContext)
};

}  // namespace pyx
