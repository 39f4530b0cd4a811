#include "sources/diag/DecodeState.h"
#include "sources/diag/LogDecoder.h"

namespace pyx::diag {

std::span<const LogDecoderRow> lteRrcDecoders() {
    return {};
}

}  // namespace pyx::diag

namespace pyx::diag {

std::span<const EventDecoderRow> eventDecoders() {
    return {};
}

}  // namespace pyx::diag
