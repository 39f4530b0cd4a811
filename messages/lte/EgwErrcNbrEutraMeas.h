// One LTE neighbour cell measurement.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_EgwErrcNbrEutraMeas(F)                        \
    F##_U32(1, "nbr_earfcn", nbrEarfcn, NbrEarfcn)               \
    F##_U32(2, "nbr_phys_cell_id", nbrPhysCellId, NbrPhysCellId) \
    F##_U32(3, "freq_band_ind", freqBandInd, FreqBandInd)        \
    F##_S32(4, "nbr_rsrp", nbrRsrp, NbrRsrp)                     \
    F##_S32(5, "nbr_rsrq", nbrRsrq, NbrRsrq)
// clang-format on

namespace pyx {

class EgwErrcNbrEutraMeas {
    PYX_MESSAGE_BODY(EgwErrcNbrEutraMeas)
};

}  // namespace pyx
