#include <array>

#include "sources/diag/LogDecoder.h"

namespace pyx::diag {

std::span<const std::span<const LogDecoderRow>> logDecoderTables() {
    static const std::array<std::span<const LogDecoderRow>, 7> tables = {
        lteServingDecoders(), lteConnectedDecoders(), lteRrcDecoders(), lteTxPowerDecoders(),
        umtsDecoders(),       gsmDecoders(),          nasDecoders()};
    return tables;
}

}  // namespace pyx::diag
