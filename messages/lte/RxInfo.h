// One receive chain's measurement (LTE and UMTS serving cell).
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_RxInfo(F)                       \
    F##_S32(1, "rssi", rssi, Rssi)                 \
    F##_U32(2, "rsrp_range", rsrpRange, RsrpRange) \
    F##_U32(3, "rsrq_range", rsrqRange, RsrqRange) \
    F##_S32(4, "snr", snr, Snr)
// clang-format on

namespace pyx {

class RxInfo {
    PYX_MESSAGE_BODY(RxInfo)
};

}  // namespace pyx
