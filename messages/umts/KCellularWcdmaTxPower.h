// WCDMA uplink transmit power.
#pragma once

#include "messages/Message.h"
#include "messages/lte/TxPowerInfo.h"

// clang-format off
#define PYX_FIELDS_KCellularWcdmaTxPower(F)                                                         \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                                   \
    F##_MSGS(2, "tx_power_info", txPowerInfos, TxPowerInfos, txPowerInfo, TxPowerInfo, TxPowerInfo)
// clang-format on

namespace pyx {

class KCellularWcdmaTxPower {
    PYX_MESSAGE_BODY(KCellularWcdmaTxPower)
};

}  // namespace pyx
