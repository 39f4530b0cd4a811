// What the LTE serving decoders remember between packets.
#pragma once

namespace pyx::diag {

struct LteServingState {};

}  // namespace pyx::diag
