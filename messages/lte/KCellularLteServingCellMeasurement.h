// LTE serving cell measurement: one RxInfo per receive chain.
#pragma once

#include "messages/Message.h"
#include "messages/lte/RxInfo.h"

// clang-format off
#define PYX_FIELDS_KCellularLteServingCellMeasurement(F)               \
    F##_U64(1, "timestamp", timestamp, Timestamp)                      \
    F##_BOOL(2, "is_connected_mode", isConnectedMode, IsConnectedMode) \
    F##_MSGS(3, "rx_info", rxInfos, RxInfos, rxInfo, RxInfo, RxInfo)
// clang-format on

namespace pyx {

class KCellularLteServingCellMeasurement {
    PYX_MESSAGE_BODY(KCellularLteServingCellMeasurement)
};

}  // namespace pyx
