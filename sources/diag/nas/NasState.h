// What the NAS decoders remember between packets.
#pragma once

namespace pyx::diag {

struct NasState {};

}  // namespace pyx::diag
