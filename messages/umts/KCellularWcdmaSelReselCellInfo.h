// WCDMA cell selection and reselection parameters with per-RAT priorities.
#pragma once

#include "messages/Message.h"
#include "messages/umts/EutraFreqInfo.h"
#include "messages/umts/GsmFreqInfo.h"
#include "messages/umts/UmtsEnums.h"
#include "messages/umts/UtraFreqInfo.h"

// clang-format off
#define PYX_FIELDS_KCellularWcdmaSelReselCellInfo(F)                                                             \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                                                \
    F##_U32(2, "hsdpa_capable", hsdpaCapable, HsdpaCapable)                                                      \
    F##_U32(3, "edch_capable", edchCapable, EdchCapable)                                                         \
    F##_ENUM(4, "duplex_mode", duplexMode, DuplexMode, WcdmaDuplexMode)                                          \
    F##_U32S(5, "multi_band_info", multiBandInfos, MultiBandInfos, multiBandInfo, MultiBandInfo)                 \
    F##_U32(6, "ims_emergency_support", imsEmergencySupport, ImsEmergencySupport)                                \
    F##_U32(7, "cell_barred", cellBarred, CellBarred)                                                            \
    F##_U32(8, "fach_meas_occ_info_present", fachMeasOccInfoPresent, FachMeasOccInfoPresent)                     \
    F##_S32(9, "s_rxlev", sRxlev, SRxlev)                                                                        \
    F##_S32(10, "s_qual", sQual, SQual)                                                                          \
    F##_S32(11, "s_intrasearch", sIntrasearch, SIntrasearch)                                                     \
    F##_S32(12, "s_intersearch", sIntersearch, SIntersearch)                                                     \
    F##_S32(13, "s_search_rat", sSearchRat, SSearchRat)                                                          \
    F##_U32(21, "s_cell_prio", sCellPrio, SCellPrio)                                                             \
    F##_MSGS(22, "eutra_prio_info", eutraPrioInfos, EutraPrioInfos, eutraPrioInfo, EutraPrioInfo, EutraFreqInfo) \
    F##_MSGS(23, "utra_prio_info", utraPrioInfos, UtraPrioInfos, utraPrioInfo, UtraPrioInfo, UtraFreqInfo)       \
    F##_MSGS(24, "gsm_prio_info", gsmPrioInfos, GsmPrioInfos, gsmPrioInfo, GsmPrioInfo, GsmFreqInfo)
// clang-format on

namespace pyx {

class KCellularWcdmaSelReselCellInfo {
    PYX_MESSAGE_BODY(KCellularWcdmaSelReselCellInfo)
};

}  // namespace pyx
