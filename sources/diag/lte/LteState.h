// What the LTE decoders remember between packets, one part per area.
#pragma once

#include "sources/diag/lte/LteConnectedState.h"
#include "sources/diag/lte/LteRrcState.h"
#include "sources/diag/lte/LteServingState.h"

namespace pyx::diag {

struct LteState {
    LteServingState serving;      // lte/LteServingDecoders.cpp
    LteConnectedState connected;  // lte/LteConnectedDecoders.cpp
    LteRrcState rrc;              // lte/LteRrcDecoders.cpp, lte/LteTxPowerDecoders.cpp
};

}  // namespace pyx::diag
