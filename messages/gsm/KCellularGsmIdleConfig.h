// GSM idle-mode cell configuration (system information parameters).
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_KCellularGsmIdleConfig(F)                                 \
    F##_U64(1, "timestamp", timestamp, Timestamp)                            \
    F##_U32(2, "arfcn_bcch", arfcnBcch, ArfcnBcch)                           \
    F##_U32(3, "mcc", mcc, Mcc)                                              \
    F##_U32(4, "mnc", mnc, Mnc)                                              \
    F##_U32(5, "lac", lac, Lac)                                              \
    F##_U32(6, "ci", ci, Ci)                                                 \
    F##_U32(7, "bsic", bsic, Bsic)                                           \
    F##_U32(8, "dtx_from_bs", dtxFromBs, DtxFromBs)                          \
    F##_U32(9, "radio_link_timeout", radioLinkTimeout, RadioLinkTimeout)     \
    F##_U32(10, "multib_rep", multibRep, MultibRep)                          \
    F##_U32(11, "gsm_band", gsmBand, GsmBand)                                \
    F##_U32(12, "access_tech", accessTech, AccessTech)                       \
    F##_U32(13, "type_of_cur_chan", typeOfCurChan, TypeOfCurChan)            \
    F##_U32(14, "ms_txpwr", msTxpwr, MsTxpwr)                                \
    F##_U32(15, "rx_acc_min", rxAccMin, RxAccMin)                            \
    F##_U32(16, "cbq", cbq, Cbq)                                             \
    F##_U32(17, "cba", cba, Cba)                                             \
    F##_U32(18, "c2_valid", c2Valid, C2Valid)                                \
    F##_U32(19, "cr_offset", crOffset, CrOffset)                             \
    F##_U32(20, "tmp_offset", tmpOffset, TmpOffset)                          \
    F##_U32(21, "penalty_t", penaltyT, PenaltyT)                             \
    F##_U32(22, "t3212", t3212, T3212)                                       \
    F##_U32(23, "acc", acc, Acc)                                             \
    F##_U32(24, "bs_pa_mfrms", bsPaMfrms, BsPaMfrms)                         \
    F##_U32(25, "cs_pagemode", csPagemode, CsPagemode)                       \
    F##_U32(26, "max_retrans_cs", maxRetransCs, MaxRetransCs)                \
    F##_U32(27, "emerg_call_allowed", emergCallAllowed, EmergCallAllowed)    \
    F##_U32(28, "attach_allowed", attachAllowed, AttachAllowed)              \
    F##_U32(29, "half_rate_supported", halfRateSupported, HalfRateSupported) \
    F##_U32(30, "si_7_8_broadcast", si78Broadcast, Si78Broadcast)            \
    F##_U32(31, "cbch_supported", cbchSupported, CbchSupported)              \
    F##_U32(32, "reest_allowed", reestAllowed, ReestAllowed)                 \
    F##_U32(33, "ecsc", ecsc, Ecsc)                                          \
    F##_U32(34, "si_2_ter_needed", si2TerNeeded, Si2TerNeeded)
// clang-format on

namespace pyx {

class KCellularGsmIdleConfig {
    PYX_MESSAGE_BODY(KCellularGsmIdleConfig)
};

}  // namespace pyx
