// LTE secondary cell measurements.
#pragma once

#include "messages/Message.h"
#include "messages/lte/SccRxMeasurement.h"

// clang-format off
#define PYX_FIELDS_KCellularLteSecondaryCellMeasurements(F)                                                                       \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                                                                 \
    F##_MSGS(2, "scc_rx_measurement", sccRxMeasurements, SccRxMeasurements, sccRxMeasurement, SccRxMeasurement, SccRxMeasurement)
// clang-format on

namespace pyx {

class KCellularLteSecondaryCellMeasurements {
    PYX_MESSAGE_BODY(KCellularLteSecondaryCellMeasurements)
};

}  // namespace pyx
