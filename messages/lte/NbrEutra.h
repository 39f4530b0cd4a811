// Reselection parameters of one LTE neighbour frequency.
#pragma once

#include "messages/Message.h"
#include "messages/lte/LteEnums.h"

// clang-format off
#define PYX_FIELDS_NbrEutra(F)                                          \
    F##_U32(1, "earfcn", earfcn, Earfcn)                                \
    F##_S32(2, "Q_rxlev_min", qRxlevMin, QRxlevMin)                     \
    F##_S32(3, "Q_qual_min", qQualMin, QQualMin)                        \
    F##_S32(4, "Q_offset", qOffset, QOffset)                            \
    F##_S32(5, "Pmax", pmax, Pmax)                                      \
    F##_U32(6, "dl_bw", dlBw, DlBw)                                     \
    F##_U32(7, "Thres_X_highP", thresXHighP, ThresXHighP)               \
    F##_U32(8, "Thres_X_lowP", thresXLowP, ThresXLowP)                  \
    F##_U32(9, "Thres_X_highQ", thresXHighQ, ThresXHighQ)               \
    F##_U32(10, "Thres_X_lowQ", thresXLowQ, ThresXLowQ)                 \
    F##_U32(11, "priority", priority, Priority)                         \
    F##_ENUM(12, "frame_type", frameType, FrameType, NbrEutraFrameType) \
    F##_U32(13, "band", band, Band)
// clang-format on

namespace pyx {

class NbrEutra {
    PYX_MESSAGE_BODY(NbrEutra)
};

}  // namespace pyx
