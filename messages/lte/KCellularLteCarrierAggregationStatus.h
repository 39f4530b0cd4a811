// LTE carrier aggregation status: the secondary carriers.
#pragma once

#include "messages/Message.h"
#include "messages/lte/SecondaryComponentCarrier.h"

// clang-format off
#define PYX_FIELDS_KCellularLteCarrierAggregationStatus(F)                                   \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                            \
    F##_MSGS(2, "scc_list", sccLists, SccLists, sccList, SccList, SecondaryComponentCarrier)
// clang-format on

namespace pyx {

class KCellularLteCarrierAggregationStatus {
    PYX_MESSAGE_BODY(KCellularLteCarrierAggregationStatus)
};

}  // namespace pyx
