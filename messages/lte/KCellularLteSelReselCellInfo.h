// LTE cell selection and reselection parameters, with neighbour frequencies.
#pragma once

#include "messages/Message.h"
#include "messages/lte/NbrEutra.h"

// clang-format off
#define PYX_FIELDS_KCellularLteSelReselCellInfo(F)                                                                              \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                                                               \
    F##_U32S(2, "multi_band_info", multiBandInfos, MultiBandInfos, multiBandInfo, MultiBandInfo)                                \
    F##_U32(3, "ims_emergency_support", imsEmergencySupport, ImsEmergencySupport)                                               \
    F##_U32(4, "ac_barring_for_emergency", acBarringForEmergency, AcBarringForEmergency)                                        \
    F##_U32(5, "mo_signalling_ac_barring_factor", moSignallingAcBarringFactor, MoSignallingAcBarringFactor)                     \
    F##_U32(6, "mo_signalling_ac_barring_time", moSignallingAcBarringTime, MoSignallingAcBarringTime)                           \
    F##_U32(7, "mo_signalling_ac_barring_for_special_ac", moSignallingAcBarringForSpecialAc, MoSignallingAcBarringForSpecialAc) \
    F##_U32(8, "mo_data_ac_barring_factor", moDataAcBarringFactor, MoDataAcBarringFactor)                                       \
    F##_U32(9, "mo_data_ac_barring_time", moDataAcBarringTime, MoDataAcBarringTime)                                             \
    F##_U32(10, "mo_data_ac_barring_for_special_ac", moDataAcBarringForSpecialAc, MoDataAcBarringForSpecialAc)                  \
    F##_S32(11, "QRxLevMin", qRxLevMin, QRxLevMin)                                                                              \
    F##_S32(12, "QQualMin", qQualMin, QQualMin)                                                                                 \
    F##_U32(13, "Q_hyst", qHyst, QHyst)                                                                                         \
    F##_U32(14, "S_non_intra_search_P", sNonIntraSearchP, SNonIntraSearchP)                                                     \
    F##_U32(15, "S_non_intra_search_Q", sNonIntraSearchQ, SNonIntraSearchQ)                                                     \
    F##_U32(16, "S_intra_search_P", sIntraSearchP, SIntraSearchP)                                                               \
    F##_U32(17, "S_intra_search_Q", sIntraSearchQ, SIntraSearchQ)                                                               \
    F##_U32(18, "Thresh_serving_lowP", threshServingLowP, ThreshServingLowP)                                                    \
    F##_U32(19, "Thresh_serving_lowQ", threshServingLowQ, ThreshServingLowQ)                                                    \
    F##_U32(20, "priority_operating_freq", priorityOperatingFreq, PriorityOperatingFreq)                                        \
    F##_MSGS(21, "nbr_eutra", nbrEutras, NbrEutras, nbrEutra, NbrEutra, NbrEutra)
// clang-format on

namespace pyx {

class KCellularLteSelReselCellInfo {
    PYX_MESSAGE_BODY(KCellularLteSelReselCellInfo)
};

}  // namespace pyx
