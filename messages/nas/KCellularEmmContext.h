// EMM registration context.
#pragma once

#include "messages/Message.h"
#include "messages/nas/Guti.h"
#include "messages/nas/KCellularTrackingAreaId.h"
#include "messages/nas/NasEnums.h"

// clang-format off
#define PYX_FIELDS_KCellularEmmContext(F)                                                     \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                             \
    F##_ENUM(2, "reg_status", regStatus, RegStatus, RegStatus)                                \
    F##_ENUM(3, "update_status", updateStatus, UpdateStatus, EmmUpdateStatus)                 \
    F##_ENUM(4, "ue_op_mode", ueOpMode, UeOpMode, EpsUeOpMode)                                \
    F##_MSGS(5, "tai_list", taiLists, TaiLists, taiList, TaiList, KCellularTrackingAreaId)    \
    F##_MSG(6, "guti", guti, Guti, Guti)                                                      \
    F##_ENUM(7, "reject_cause", rejectCause, RejectCause, EmmCause)                           \
    F##_ENUM(8, "reg_proc", regProc, RegProc, EmmRegProc)                                     \
    F##_U32(9, "t3412_dur_s", t3412DurS, T3412DurS)                                           \
    F##_BOOL(10, "is_ims_voice_supported", isImsVoiceSupported, IsImsVoiceSupported)          \
    F##_BOOL(11, "is_emerg_bearer_supported", isEmergBearerSupported, IsEmergBearerSupported)
// clang-format on

namespace pyx {

class KCellularEmmContext {
    PYX_MESSAGE_BODY(KCellularEmmContext)
};

}  // namespace pyx
