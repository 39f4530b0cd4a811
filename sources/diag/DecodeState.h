// What the decoders remember between packets: each technology's last serving cell and the
// like, so that a packet that carries only part of a screen's values can be written whole.
#pragma once

#include "sources/diag/gsm/GsmState.h"
#include "sources/diag/lte/LteState.h"
#include "sources/diag/nas/NasState.h"
#include "sources/diag/umts/UmtsState.h"

namespace pyx::diag {

struct DecodeState {
    LteState lte;
    UmtsState umts;
    GsmState gsm;
    NasState nas;
};

}  // namespace pyx::diag
