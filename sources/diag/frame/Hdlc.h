// The DIAG port's framing: each packet is followed by its CRC-16/X-25 (little-endian), 0x7E and
// 0x7D inside are escaped as 0x7D, byte ^ 0x20, and a 0x7E ends the frame. A stream may start
// in the middle of a frame and carry noise; the deframer resynchronises on the next 0x7E.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>

#include "core/Value.h"

namespace pyx::diag {

// CRC-16/X-25 (reflected 0x1021, init 0xFFFF, final XOR 0xFFFF); "123456789" gives 0x906E.
[[nodiscard]] std::uint16_t crc16x25(std::span<const std::uint8_t> bytes);

// Appends packet as one frame for the wire: packet, its CRC, both escaped, then 0x7E.
void appendFrame(std::span<const std::uint8_t> packet, Bytes& out);
[[nodiscard]] Bytes frame(std::span<const std::uint8_t> packet);

// Splits a byte stream into the packets of its frames. Bytes may come in pieces of any size;
// a frame cut between two pieces is kept until its end arrives.
class Deframer {
  public:
    struct Counts {
        std::uint64_t bytes = 0;   // fed
        std::uint64_t frames = 0;  // whole frames whose CRC holds (handed on)
        // Frames whose CRC does not hold, too short for a command byte and a CRC, broken by an
        // escape right before the flag, or longer than any packet.
        std::uint64_t badFrames = 0;
        std::uint64_t empty = 0;  // 0x7E with nothing before it (a leading flag): skipped
    };

    // Calls onPacket(packet) for each good frame's packet (unescaped, CRC removed), in order;
    // the span is valid during the call only.
    template <typename OnPacket>
    void feed(std::span<const std::uint8_t> bytes, OnPacket&& onPacket);

    // The bytes of a frame begun and not ended (0 when the stream ended on a frame's end). At
    // the end of a capture these are a final frame cut short: normal, counted, not an error.
    [[nodiscard]] std::size_t pending() const { return pending_.size(); }
    // Forgets a frame begun (a port reopened).
    void reset() {
        pending_.clear();
        escaped_ = false;
        overlong_ = false;
    }
    [[nodiscard]] const Counts& counts() const { return counts_; }

  private:
    static constexpr std::uint8_t kFlag = 0x7E;
    static constexpr std::uint8_t kEscape = 0x7D;
    // The longest frame taken (unescaped, CRC included): a log packet's u16 lengths, a
    // multi-SIM wrapper and the CRC fit well inside. Longer ones are bad frames, and a stream
    // of noise without a flag does not grow pending_ past it.
    static constexpr std::size_t kMaxFrame = std::size_t{1} << 17;

    // Appends the unescaped bytes of segment (no flag inside) to pending_.
    void append(std::span<const std::uint8_t> segment);
    // Ends the frame in pending_ (unescaped): checks and strips the CRC; true when good.
    bool endFrame();
    // Counts a whole unescaped frame; its packet (CRC removed) when the CRC holds.
    std::optional<std::span<const std::uint8_t>> checkFrame(std::span<const std::uint8_t> frame);

    Bytes pending_;          // the unescaped bytes of the frame being read
    bool escaped_ = false;   // the last byte read was an escape
    bool overlong_ = false;  // the frame being read passed kMaxFrame: dropped up to its flag
    Counts counts_;
};

}  // namespace pyx::diag

#include "sources/diag/frame/Deframer.inl"
