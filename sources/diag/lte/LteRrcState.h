// What the LTE rrc decoders remember between packets.
#pragma once

namespace pyx::diag {

struct LteRrcState {};

}  // namespace pyx::diag
