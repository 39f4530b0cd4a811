// LTE serving cell identity: cell, frequencies, bandwidths, PLMN, TDD configuration.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_KCellularLteScellInfo(F)                              \
    F##_U64(1, "timestamp", timestamp, Timestamp)                        \
    F##_U32(2, "phy_cell_id", phyCellId, PhyCellId)                      \
    F##_U32(3, "dl_freq", dlFreq, DlFreq)                                \
    F##_U32(4, "ul_freq", ulFreq, UlFreq)                                \
    F##_U32(5, "dl_bw", dlBw, DlBw)                                      \
    F##_U32(6, "ul_bw", ulBw, UlBw)                                      \
    F##_U32(7, "cell_id", cellId, CellId)                                \
    F##_U32(8, "freq_band_ind", freqBandInd, FreqBandInd)                \
    F##_U32(9, "tracking_area_code", trackingAreaCode, TrackingAreaCode) \
    F##_U32(10, "num_mnc_digits", numMncDigits, NumMncDigits)            \
    F##_U32(11, "sel_plmn_mcc", selPlmnMcc, SelPlmnMcc)                  \
    F##_U32(12, "sel_plmn_mnc", selPlmnMnc, SelPlmnMnc)                  \
    F##_U32(14, "tdd_sf_assignment", tddSfAssignment, TddSfAssignment)   \
    F##_U32(15, "tdd_ssf_patterns", tddSsfPatterns, TddSsfPatterns)
// clang-format on

namespace pyx {

class KCellularLteScellInfo {
    PYX_MESSAGE_BODY(KCellularLteScellInfo)
};

}  // namespace pyx
