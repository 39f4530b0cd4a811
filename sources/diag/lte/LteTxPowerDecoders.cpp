#include "sources/diag/DecodeState.h"
#include "sources/diag/LogDecoder.h"

namespace pyx::diag {

std::span<const LogDecoderRow> lteTxPowerDecoders() {
    return {};
}

}  // namespace pyx::diag
