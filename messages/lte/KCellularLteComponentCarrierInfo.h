// LTE component carriers: primary and two secondary carriers.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_KCellularLteComponentCarrierInfo(F)         \
    F##_U64(1, "timestamp", timestamp, Timestamp)              \
    F##_U32(2, "pcc_earfcn", pccEarfcn, PccEarfcn)             \
    F##_U32(3, "scc0_earfcn", scc0Earfcn, Scc0Earfcn)          \
    F##_U32(4, "scc1_earfcn", scc1Earfcn, Scc1Earfcn)          \
    F##_U32(5, "pcc_bandwidth", pccBandwidth, PccBandwidth)    \
    F##_U32(6, "scc0_bandwidth", scc0Bandwidth, Scc0Bandwidth) \
    F##_U32(7, "scc1_bandwidth", scc1Bandwidth, Scc1Bandwidth)
// clang-format on

namespace pyx {

class KCellularLteComponentCarrierInfo {
    PYX_MESSAGE_BODY(KCellularLteComponentCarrierInfo)
};

}  // namespace pyx
