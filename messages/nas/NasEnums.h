// Enumerations of the NAS, bearer and SIM messages: named constants and name tables.
#pragma once

#include <cstdint>

#include "messages/EnumTable.h"

// The registration status of the MM, GMM and EMM contexts.
// clang-format off
#define PYX_ENUM_RegStatus(E)                       \
    E(0, KREG_STATUS_NORMAL_SERVICE)                \
    E(1, KREG_STATUS_REGISTRATION_FAILURE)          \
    E(2, KREG_STATUS_LIMITED_SERVICE)               \
    E(3, KREG_STATUS_NO_SERVICE)                    \
    E(4, KREG_STATUS_AT_NOT_REGISTERED)             \
    E(5, KREG_STATUS_REGISTRATION_SERVICE_DISABLED) \
    E(6, KREG_STATUS_SERVICE_DETACHED)              \
    E(7, KREG_STATUS_SERVICE_ACTIVATED)             \
    E(8, KREG_STATUS_EMERGENCY_SERVICE)             \
    E(9, KREG_STATUS_EMERGENCY_LIMITED)             \
    E(10, KREG_STATUS_REGISTERED_SMS_ONLY)          \
    E(11, KREG_STATUS_REGISTRATION_IN_PROGRESS)     \
    E(12, KREG_STATUS_POWER_OFF_NO_SERVICE)
// clang-format on

// The MM update status (0 has no name).
// clang-format off
#define PYX_ENUM_MmUpdateStatus(E)   \
    E(1, STATUS_UPDATED)             \
    E(2, STATUS_NOT_UPDATED)         \
    E(3, STATUS_ROAMING_NOT_ALLOWED) \
    E(4, STATUS_UPDATE_DISABLED)
// clang-format on

// The GMM update status.
// clang-format off
#define PYX_ENUM_GmmUpdateStatus(E)       \
    E(0, GPRS_STATUS_UPDATED)             \
    E(1, GPRS_STATUS_NOT_UPDATED)         \
    E(2, GPRS_STATUS_ROAMING_NOT_ALLOWED)
// clang-format on

// The EMM update status.
// clang-format off
#define PYX_ENUM_EmmUpdateStatus(E)      \
    E(0, EPS_STATUS_UPDATED)             \
    E(1, EPS_STATUS_NOT_UPDATED)         \
    E(2, EPS_STATUS_ROAMING_NOT_ALLOWED)
// clang-format on

// The MM/GMM procedure failure cause.
// clang-format off
#define PYX_ENUM_MmProcFailureCause(E)                   \
    E(0, KNAS_MM_PROC_FAILURE_CAUSE_NONE)                \
    E(1, KNAS_MM_PROC_FAILURE_CAUSE_LOWER_LAYER_FAILURE) \
    E(2, KNAS_MM_PROC_FAILURE_CAUSE_ACCESS_BARRED)       \
    E(3, KNAS_MM_PROC_FAILURE_CAUSE_LIMITED_SERVICE)     \
    E(4, KNAS_MM_PROC_FAILURE_CAUSE_PAGE_NOT_EXPECTED)   \
    E(5, KNAS_MM_PROC_FAILURE_CAUSE_T3210_EXPIRY)        \
    E(6, KNAS_MM_PROC_FAILURE_CAUSE_T3240_EXPIRY)        \
    E(7, KNAS_MM_PROC_FAILURE_CAUSE_DETACH_INITIATED)    \
    E(8, KNAS_MM_PROC_FAILURE_CAUSE_PS_SUSPENDED)        \
    E(9, KNAS_MM_PROC_FAILURE_CAUSE_SERV_REQ_THROTTLING) \
    E(10, KNAS_MM_PROC_FAILURE_CAUSE_T3317_EXPIRY)       \
    E(11, KNAS_MM_PROC_FAILURE_CAUSE_REJECTED_BY_NW)     \
    E(12, KNAS_MM_PROC_FAILURE_CAUSE_NW_AUTH_REJ)        \
    E(13, KNAS_MM_PROC_FAILURE_CAUSE_INVALID_IE)         \
    E(14, KNAS_MM_PROC_FAILURE_CAUSE_TIMEOUT)            \
    E(15, KNAS_MM_PROC_FAILURE_CAUSE_OTHER)
// clang-format on

// The MM/GMM reject cause (cause numbers, with gaps).
// clang-format off
#define PYX_ENUM_MmRejectCause(E)                                    \
    E(0, KNAS_MM_REJ_CAUSE_NONE)                                     \
    E(2, KNAS_MM_REJ_CAUSE_IMSI_UNKNOWN)                             \
    E(3, KNAS_MM_REJ_CAUSE_ILLEGAL_MS)                               \
    E(4, KNAS_MM_REJ_CAUSE_IMSI_UNKNOWN_IN_VLR)                      \
    E(5, KNAS_MM_REJ_CAUSE_IMEI_NOT_ACCEPTED)                        \
    E(6, KNAS_MM_REJ_CAUSE_ILLEGAL_ME)                               \
    E(7, KNAS_MM_REJ_CAUSE_GPRS_SERVICES_NOT_ALLOWED)                \
    E(8, KNAS_MM_REJ_CAUSE_GPRS_AND_NON_GPRS_SERVICES_NOT_ALLOWED)   \
    E(9, KNAS_MM_REJ_CAUSE_MS_IDENTITY_NOT_DERIVED_BY_NW)            \
    E(10, KNAS_MM_REJ_CAUSE_IMPLICITLY_DET)                          \
    E(11, KNAS_MM_REJ_CAUSE_PLMN_NOT_ALLOWED)                        \
    E(12, KNAS_MM_REJ_CAUSE_LA_NOT_ALLOWED)                          \
    E(13, KNAS_MM_REJ_CAUSE_ROM_NOT_ALLOWED_IN_LA)                   \
    E(14, KNAS_MM_REJ_CAUSE_GPRS_NOT_ALLOWED_IN_PLMN)                \
    E(15, KNAS_MM_REJ_CAUSE_NO_SUITABLE_CELL_IN_LA)                  \
    E(16, KNAS_MM_REJ_CAUSE_MSC_OUT_OF_REACH)                        \
    E(17, KNAS_MM_REJ_CAUSE_NW_FAILURE)                              \
    E(20, KNAS_MM_REJ_CAUSE_MAC_FAILURE)                             \
    E(21, KNAS_MM_REJ_CAUSE_SYNCH_FAILURE)                           \
    E(22, KNAS_MM_REJ_CAUSE_CONGESTION)                              \
    E(23, KNAS_MM_REJ_CAUSE_GSM_AUTH_UNACCEPTABLE)                   \
    E(25, KNAS_MM_REJ_CAUSE_CSG_NOT_AUTHORIZED)                      \
    E(32, KNAS_MM_REJ_CAUSE_SERVICE_OPTION_NOT_SUPPORTED)            \
    E(33, KNAS_MM_REJ_CAUSE_REQ_SERVICE_OPTION_NOT_SUBSCRIBED)       \
    E(34, KNAS_MM_REJ_CAUSE_SERVICE_OPTION_TEMPORARILY_OUT_OF_ORDER) \
    E(38, KNAS_MM_REJ_CAUSE_CALL_NOT_IDENTIFIED)                     \
    E(40, KNAS_MM_REJ_CAUSE_NO_PDP_CONTEXT_ACTIVATED)                \
    E(63, KNAS_MM_REJ_CAUSE_RETRY_UPON_ENTRY_TO_NEW_CELL)            \
    E(95, KNAS_MM_REJ_CAUSE_SEMANTICALLY_INCORRECT_MSG)              \
    E(96, KNAS_MM_REJ_CAUSE_INVALID_MANDATORY_INFO)                  \
    E(97, KNAS_MM_REJ_CAUSE_MSG_TYPE_NOT_IMPL)                       \
    E(98, KNAS_MM_REJ_CAUSE_MSG_TYPE_NOT_COMPATIBLE)                 \
    E(99, KNAS_MM_REJ_CAUSE_INFO_ELEMENT_NOT_IMPL)                   \
    E(100, KNAS_MM_REJ_CAUSE_IE_ERROR)                               \
    E(101, KNAS_MM_REJ_CAUSE_MSG_NOT_COMPATIBLE)                     \
    E(111, KNAS_MM_REJ_CAUSE_PROTOCOL_ERROR_UNSPECIFIED)
// clang-format on

// The GMM registration procedure.
// clang-format off
#define PYX_ENUM_GmmRegProc(E)                  \
    E(0, KNAS_MM_REG_PROC_LOCATION_AREA_UPDATE) \
    E(1, KNAS_MM_REG_PROC_ATTACH)               \
    E(2, KNAS_MM_REG_PROC_ROUTING_AREA_UPDATE)  \
    E(3, KNAS_MM_REG_PROC_COMBINED_RAU)         \
    E(4, KNAS_MM_REG_PROC_COMBINED_ATTACH)      \
    E(5, KNAS_MM_REG_PROC_NW_DETACH)            \
    E(6, KNAS_MM_REG_PROC_SERVICE_REQ)          \
    E(7, KNAS_MM_REG_PROC_NW_ABORT)             \
    E(8, KNAS_MM_REG_PROC_TRACKING_AREA_UPDATE) \
    E(9, KNAS_MM_REG_PROC_COMBINED_TAU)         \
    E(10, KNAS_MM_REG_PROC_PROC_NONE)
// clang-format on

// The UE mode of operation.
// clang-format off
#define PYX_ENUM_EpsUeOpMode(E)      \
    E(0, EPS_UE_OP_MODE_PS_MODE_1)   \
    E(1, EPS_UE_OP_MODE_PS_MODE_2)   \
    E(2, EPS_UE_OP_MODE_CSPS_MODE_1) \
    E(3, EPS_UE_OP_MODE_CSPS_MODE_2)
// clang-format on

// The EMM procedure.
// clang-format off
#define PYX_ENUM_EmmRegProc(E)      \
    E(0, EMM_PROC_NO_PROC)          \
    E(1, EMM_PROC_ATTACH)           \
    E(2, EMM_PROC_ATTACH_COMB)      \
    E(3, EMM_PROC_EMERGENCY_ATTACH) \
    E(4, EMM_PROC_TAU)              \
    E(5, EMM_PROC_TAU_COMB)         \
    E(6, EMM_PROC_PERIODIC_TAU)     \
    E(7, EMM_PROC_SERV_REQ)
// clang-format on

// The EMM reject cause (cause numbers, with gaps).
// clang-format off
#define PYX_ENUM_EmmCause(E)                                              \
    E(0, EMM_CAUSE_NO_CAUSE)                                              \
    E(2, EMM_CAUSE_IMSI_UNKNOWN_IN_HSS)                                   \
    E(3, EMM_CAUSE_ILLEGAL_UE)                                            \
    E(5, EMM_CAUSE_IMEI_NOT_ACCEPTED)                                     \
    E(6, EMM_CAUSE_ILLEGAL_ME)                                            \
    E(7, EMM_CAUSE_EPS_SERVICES_NOT_ALLOWED)                              \
    E(8, EMM_CAUSE_EPS_SERVICES_AND_NON_EPS_SERVICES_NOT_ALLOWED)         \
    E(9, EMM_CAUSE_UE_IDENTITY_CANNOT_BE_DERIVED_BY_NETWORK)              \
    E(10, EMM_CAUSE_IMPLICITLY_DETACHED)                                  \
    E(11, EMM_CAUSE_PLMN_NOT_ALLOWED)                                     \
    E(12, EMM_CAUSE_TRACKING_AREA_NOT_ALLOWED)                            \
    E(13, EMM_CAUSE_ROAMING_NOT_ALLOWED_IN_THIS_TRACKING_AREA)            \
    E(14, EMM_CAUSE_EPS_SERVICES_NOT_ALLOWED_IN_THIS_PLMN)                \
    E(15, EMM_CAUSE_NO_SUITABLE_CELLS_IN_TRACKING_AREA)                   \
    E(16, EMM_CAUSE_MSC_TEMPORARILY_NOT_REACHABLE)                        \
    E(17, EMM_CAUSE_NETWORK_FAILURE)                                      \
    E(18, EMM_CAUSE_CS_DOMAIN_NOT_AVAILABLE)                              \
    E(19, EMM_CAUSE_ESM_FAILURE)                                          \
    E(20, EMM_CAUSE_MAC_FAILURE)                                          \
    E(21, EMM_CAUSE_SYNCH_FAILURE)                                        \
    E(22, EMM_CAUSE_CONGESTION)                                           \
    E(23, EMM_CAUSE_UE_SECURITY_CAPABILITY_MISMATCH)                      \
    E(24, EMM_CAUSE_SECURITY_MODE_REJECTED_UNSPECIFIED)                   \
    E(25, EMM_CAUSE_NOT_AUTHORIZED_FOR_THIS_CSG)                          \
    E(26, EMM_CAUSE_NON_EPS_AUTHENTICATION_UNACCEPTABLE)                  \
    E(35, EMM_CAUSE_REQUESTED_SERVICE_OPTION_NOT_AUTHORIZED_IN_THIS_PLMN) \
    E(39, EMM_CAUSE_CS_DOMAIN_TEMPORARILY_NOT_AVAILABLE)                  \
    E(40, EMM_CAUSE_NO_EPS_BEARER_CONTEXT_ACTIVATED)                      \
    E(95, EMM_CAUSE_SEMANTICALLY_INCORRECT_MESSAGE)                       \
    E(96, EMM_CAUSE_INVALID_MANDATORY_INFORMATION)                        \
    E(97, EMM_CAUSE_MESSAGE_TYPE_NON_EXISTENT_OR_NOT_IMPLEMENTED)         \
    E(98, EMM_CAUSE_MESSAGE_TYPE_NOT_COMPATIBLE_WITH_PROTOCOL_STATE)      \
    E(99, EMM_CAUSE_IE_NON_EXISTENT_OR_NOT_IMPLEMENTED)                   \
    E(100, EMM_CAUSE_CONDITIONAL_IE_ERROR)                                \
    E(101, EMM_CAUSE_MESSAGE_NOT_COMPATIBLE_WITH_PROTOCOL_STATE)          \
    E(111, EMM_CAUSE_PROTOCOL_ERROR_UNSPECIFIED)
// clang-format on

// The PDP and DNS address type of a bearer context.
// clang-format off
#define PYX_ENUM_PdpType(E)   \
    E(0, PDP_TYPE_IPv4)       \
    E(1, PDP_TYPE_IPv6)       \
    E(2, PDP_TYPE_IPv4v6)     \
    E(3, PDP_TYPE_IPv4_PDN)   \
    E(4, PDP_TYPE_IPv6_PDN)   \
    E(5, PDP_TYPE_IPv4v6_PDN) \
    E(6, PDP_TYPE_PPP)        \
    E(7, PDP_TYPE_NONE)
// clang-format on

namespace pyx {

PYX_DECLARE_ENUM(RegStatus)
PYX_DECLARE_ENUM(MmUpdateStatus)
PYX_DECLARE_ENUM(GmmUpdateStatus)
PYX_DECLARE_ENUM(EmmUpdateStatus)
PYX_DECLARE_ENUM(MmProcFailureCause)
PYX_DECLARE_ENUM(MmRejectCause)
PYX_DECLARE_ENUM(GmmRegProc)
PYX_DECLARE_ENUM(EpsUeOpMode)
PYX_DECLARE_ENUM(EmmRegProc)
PYX_DECLARE_ENUM(EmmCause)
PYX_DECLARE_ENUM(PdpType)

}  // namespace pyx
