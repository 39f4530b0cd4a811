// MM registration context.
#pragma once

#include "messages/Message.h"
#include "messages/nas/KCellularLocationAreaId.h"
#include "messages/nas/NasEnums.h"

// clang-format off
#define PYX_FIELDS_KCellularMmContext(F)                                                      \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                             \
    F##_ENUM(2, "reg_status", regStatus, RegStatus, RegStatus)                                \
    F##_ENUM(3, "update_status", updateStatus, UpdateStatus, MmUpdateStatus)                  \
    F##_MSG(4, "lai", lai, Lai, KCellularLocationAreaId)                                      \
    F##_U32(5, "tmsi", tmsi, Tmsi)                                                            \
    F##_U32(6, "t3212_dur_s", t3212DurS, T3212DurS)                                           \
    F##_ENUM(7, "proc_failure_cause", procFailureCause, ProcFailureCause, MmProcFailureCause) \
    F##_ENUM(8, "reject_cause", rejectCause, RejectCause, MmRejectCause)                      \
    F##_BOOL(9, "is_combined_proc", isCombinedProc, IsCombinedProc)
// clang-format on

namespace pyx {

class KCellularMmContext {
    PYX_MESSAGE_BODY(KCellularMmContext)
};

}  // namespace pyx
