#include "sources/diag/DecodeState.h"
#include "sources/diag/LogDecoder.h"

namespace pyx::diag {

std::span<const LogDecoderRow> lteConnectedDecoders() {
    return {};
}

}  // namespace pyx::diag
