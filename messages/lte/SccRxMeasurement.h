// One secondary cell's receive measurement.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_SccRxMeasurement(F) \
    F##_U32(1, "index", index, Index)  \
    F##_S32(2, "rsrp", rsrp, Rsrp)     \
    F##_S32(3, "rsrq", rsrq, Rsrq)     \
    F##_S32(4, "snr", snr, Snr)        \
    F##_S32(5, "rssi", rssi, Rssi)
// clang-format on

namespace pyx {

class SccRxMeasurement {
    PYX_MESSAGE_BODY(SccRxMeasurement)
};

}  // namespace pyx
