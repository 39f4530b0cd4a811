// LTE inter-RAT neighbour measurements: UTRA and GERAN cells.
#pragma once

#include "messages/Message.h"
#include "messages/lte/EgwErrcNbrGeranMeas.h"
#include "messages/lte/EgwErrcNbrUtraMeas.h"

// clang-format off
#define PYX_FIELDS_KCellularLteNbrInterRatCellMeas(F)                                                            \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                                                \
    F##_MSGS(2, "meas_nbr_utra", measNbrUtras, MeasNbrUtras, measNbrUtra, MeasNbrUtra, EgwErrcNbrUtraMeas)       \
    F##_MSGS(3, "meas_nbr_geran", measNbrGerans, MeasNbrGerans, measNbrGeran, MeasNbrGeran, EgwErrcNbrGeranMeas)
// clang-format on

namespace pyx {

class KCellularLteNbrInterRatCellMeas {
    PYX_MESSAGE_BODY(KCellularLteNbrInterRatCellMeas)
};

}  // namespace pyx
