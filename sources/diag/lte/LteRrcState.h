// What the LTE RRC decoders remember between packets: the RRC state last written and since
// when, so that the state is written only when it changes and the state before it comes with
// how long it lasted.
#pragma once

#include <cstdint>
#include <optional>

namespace pyx::diag {

struct LteRrcState {
    // The state last written: a value of our LteRrcState enumeration (KLTE_RRC_STATE_*).
    std::optional<std::int32_t> state;
    // When that state began (the time our messages carry), when the packet that set it was the
    // transition itself; none when the state was learned in its middle (the first OTA message
    // of a capture begun while connected, or after a missed transition).
    std::optional<std::uint64_t> sinceMs;
    // An event 1606 has been seen: the modem reports its state changes itself, and the OTA
    // messages (0xB0C0) no longer write the state.
    bool fromEvents = false;
};

}  // namespace pyx::diag
