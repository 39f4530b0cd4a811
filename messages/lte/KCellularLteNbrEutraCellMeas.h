// LTE intra-RAT neighbour measurements.
#pragma once

#include "messages/Message.h"
#include "messages/lte/EgwErrcNbrEutraMeas.h"

// clang-format off
#define PYX_FIELDS_KCellularLteNbrEutraCellMeas(F)                                                               \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                                                \
    F##_MSGS(2, "meas_nbr_eutra", measNbrEutras, MeasNbrEutras, measNbrEutra, MeasNbrEutra, EgwErrcNbrEutraMeas)
// clang-format on

namespace pyx {

class KCellularLteNbrEutraCellMeas {
    PYX_MESSAGE_BODY(KCellularLteNbrEutraCellMeas)
};

}  // namespace pyx
