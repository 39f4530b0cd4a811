// What the GSM decoders remember between packets.
#pragma once

namespace pyx::diag {

struct GsmState {};

}  // namespace pyx::diag
