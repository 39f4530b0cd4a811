// WCDMA neighbour measurements: UTRA, GSM and LTE results.
#pragma once

#include "messages/Message.h"
#include "messages/umts/GsmCellMeasResult.h"
#include "messages/umts/LteCellMeasResult.h"
#include "messages/umts/UtraCellMeasResult.h"

// clang-format off
#define PYX_FIELDS_KCellularWcdmaNbrCellMeas(F)                                                                           \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                                                         \
    F##_MSGS(2, "meas_utra_result", measUtraResults, MeasUtraResults, measUtraResult, MeasUtraResult, UtraCellMeasResult) \
    F##_MSGS(3, "meas_gsm_result", measGsmResults, MeasGsmResults, measGsmResult, MeasGsmResult, GsmCellMeasResult)       \
    F##_MSGS(4, "meas_lte_result", measLteResults, MeasLteResults, measLteResult, MeasLteResult, LteCellMeasResult)
// clang-format on

namespace pyx {

class KCellularWcdmaNbrCellMeas {
    PYX_MESSAGE_BODY(KCellularWcdmaNbrCellMeas)
};

}  // namespace pyx
