// What the UMTS decoders remember between packets.
#pragma once

namespace pyx::diag {

struct UmtsState {};

}  // namespace pyx::diag
