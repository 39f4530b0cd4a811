// WCDMA RRC connection state with its establishment and release causes.
#pragma once

#include "messages/Message.h"
#include "messages/umts/UmtsEnums.h"

// clang-format off
#define PYX_FIELDS_KCellularWcdmaRrcConnectionState(F)                                                \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                                     \
    F##_ENUM(2, "state", state, State, WcdmaRrcConnState)                                             \
    F##_ENUM(3, "establishment_cause", establishmentCause, EstablishmentCause, RrcEstablishmentCause) \
    F##_ENUM(4, "release_cause", releaseCause, ReleaseCause, RrcReleaseCause)
// clang-format on

namespace pyx {

class KCellularWcdmaRrcConnectionState {
    PYX_MESSAGE_BODY(KCellularWcdmaRrcConnectionState)
};

}  // namespace pyx
