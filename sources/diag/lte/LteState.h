// What the LTE decoders remember between packets.
#pragma once

namespace pyx::diag {

struct LteState {};

}  // namespace pyx::diag
