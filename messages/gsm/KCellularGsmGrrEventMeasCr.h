// GSM GRR neighbour measurement report: GSM, UMTS and LTE neighbours.
#pragma once

#include "messages/Message.h"
#include "messages/gsm/GsmNcellMeas.h"
#include "messages/gsm/LteNcellMeas.h"
#include "messages/gsm/UmtsNcellMeas.h"

// clang-format off
#define PYX_FIELDS_KCellularGsmGrrEventMeasCr(F)                                                              \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                                             \
    F##_MSGS(2, "gsm_ncell_meas", gsmNcellMeas, GsmNcellMeas, gsmNcellMeas, GsmNcellMeas, GsmNcellMeas)       \
    F##_MSGS(3, "umts_ncell_meas", umtsNcellMeas, UmtsNcellMeas, umtsNcellMeas, UmtsNcellMeas, UmtsNcellMeas) \
    F##_MSGS(4, "lte_ncell_meas", lteNcellMeas, LteNcellMeas, lteNcellMeas, LteNcellMeas, LteNcellMeas)
// clang-format on

namespace pyx {

class KCellularGsmGrrEventMeasCr {
    PYX_MESSAGE_BODY(KCellularGsmGrrEventMeasCr)
};

}  // namespace pyx
