// Common mobility-management information: IMSI, equivalent PLMNs, forbidden LAI/TAI lists.
#pragma once

#include "messages/Message.h"
#include "messages/nas/KCellularLocationAreaId.h"
#include "messages/nas/KCellularTrackingAreaId.h"
#include "messages/nas/Plmn.h"

// clang-format off
#define PYX_FIELDS_KCellularMmCommonInfo(F)                                                                                          \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                                                                    \
    F##_BYTES(2, "imsi", imsi, Imsi)                                                                                                 \
    F##_MSGS(3, "eplmn_list", eplmnLists, EplmnLists, eplmnList, EplmnList, Plmn)                                                    \
    F##_MSGS(4, "roaming_flai_list", roamingFlaiLists, RoamingFlaiLists, roamingFlaiList, RoamingFlaiList, KCellularLocationAreaId)  \
    F##_MSGS(5, "reg_prov_flai_list", regProvFlaiLists, RegProvFlaiLists, regProvFlaiList, RegProvFlaiList, KCellularLocationAreaId) \
    F##_MSGS(6, "roaming_ftai_list", roamingFtaiLists, RoamingFtaiLists, roamingFtaiList, RoamingFtaiList, KCellularTrackingAreaId)  \
    F##_MSGS(7, "reg_prov_ftai_list", regProvFtaiLists, RegProvFtaiLists, regProvFtaiList, RegProvFtaiList, KCellularTrackingAreaId)
// clang-format on

namespace pyx {

class KCellularMmCommonInfo {
    PYX_MESSAGE_BODY(KCellularMmCommonInfo)
};

}  // namespace pyx
