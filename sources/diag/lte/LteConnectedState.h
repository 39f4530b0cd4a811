// What the LTE connected decoders remember between packets.
#pragma once

namespace pyx::diag {

struct LteConnectedState {};

}  // namespace pyx::diag
