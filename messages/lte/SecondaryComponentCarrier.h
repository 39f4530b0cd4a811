// One LTE secondary component carrier.
#pragma once

#include "messages/Message.h"
#include "messages/lte/LteEnums.h"

// clang-format off
#define PYX_FIELDS_SecondaryComponentCarrier(F)           \
    F##_U32(1, "index", index, Index)                     \
    F##_ENUM(2, "state", state, State, SccState)          \
    F##_U32(3, "pci", pci, Pci)                           \
    F##_U32(4, "dl_earfcn", dlEarfcn, DlEarfcn)           \
    F##_U32(5, "dl_rf_band", dlRfBand, DlRfBand)          \
    F##_U32(6, "dl_bandwidth", dlBandwidth, DlBandwidth)  \
    F##_BOOL(7, "has_uplink", hasUplink, HasUplink)       \
    F##_U32(8, "ul_earfcn", ulEarfcn, UlEarfcn)           \
    F##_U32(9, "ul_rf_band", ulRfBand, UlRfBand)          \
    F##_U32(10, "ul_bandwidth", ulBandwidth, UlBandwidth) \
    F##_S32(11, "rsrp", rsrp, Rsrp)                       \
    F##_S32(12, "rsrq", rsrq, Rsrq)                       \
    F##_S32(13, "snr", snr, Snr)                          \
    F##_S32(14, "rssi", rssi, Rssi)
// clang-format on

namespace pyx {

class SecondaryComponentCarrier {
    PYX_MESSAGE_BODY(SecondaryComponentCarrier)
};

}  // namespace pyx
