// WCDMA serving cell measurement: one RxInfo per receive chain.
#pragma once

#include "messages/Message.h"
#include "messages/lte/RxInfo.h"

// clang-format off
#define PYX_FIELDS_KCellularWcdmaScellMeasurement(F)                 \
    F##_U64(1, "timestamp", timestamp, Timestamp)                    \
    F##_BOOL(2, "connected_mode", connectedMode, ConnectedMode)      \
    F##_MSGS(3, "rx_info", rxInfos, RxInfos, rxInfo, RxInfo, RxInfo)
// clang-format on

namespace pyx {

class KCellularWcdmaScellMeasurement {
    PYX_MESSAGE_BODY(KCellularWcdmaScellMeasurement)
};

}  // namespace pyx
