// A DIAG byte stream (a port's, or a capture file's) turned into metric events: deframed,
// multi-SIM frames unwrapped (the first subscription is shown, others counted), log packets
// and event reports handed to the decoder tables by (code, version), everything else handed to
// the command session (responses) or counted. Knows nothing of ports, files or time.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <optional>
#include <span>
#include <string_view>
#include <utility>
#include <vector>

#include "sources/diag/DecodeState.h"
#include "sources/diag/LogDecoder.h"
#include "sources/diag/frame/Hdlc.h"

namespace pyx::diag {

// What a stream held, for pyxonctl info and the source's summary.
struct StreamStats {
    struct Counts {
        std::uint64_t decoded = 0;
        std::uint64_t notDecoded = 0;  // no row for it, or its row refused the packet
    };
    Deframer::Counts frames;     // frames, bad frames (CRC), bytes
    std::uint64_t cutShort = 0;  // bytes of a final frame cut short (set by finish())
    // Log packets by (log code, version byte payload[0], -1 for an empty payload), decoded or not.
    std::map<std::pair<std::uint16_t, int>, Counts> logs;
    // Event reports' events by event id.
    std::map<std::uint16_t, Counts> events;
    // Frames of other commands by command byte (responses, F3 messages, secure logs...).
    std::map<std::uint8_t, std::uint64_t> otherCommands;
    // Log packets whose header does not fit (declared length past the frame...), event
    // reports whose events overrun their length, multi-SIM frames too short for their header.
    std::uint64_t malformed = 0;
    // Multi-SIM (0x98) frames by subscription id; only the first one seen is decoded.
    std::map<std::uint32_t, std::uint64_t> subscriptions;
    // The modem's own times (ms since 1970) of the first and last log packet with a set clock.
    std::optional<std::uint64_t> firstTimeMs;
    std::optional<std::uint64_t> lastTimeMs;
};

// The metric events of one log packet or event report, with the packet's own time.
struct DecodedPacket {
    std::uint64_t modemTimeMs = 0;  // the packet's timestamp (0: the modem's clock is unset)
    std::vector<MetricOut> events;
};

class DiagStream {
  public:
    struct Options {
        // The time the written messages carry (ms since 1970) when the packet's own clock is
        // unset, or always with hostTime; none: the packet's own only.
        std::function<std::uint64_t()> now;
        bool hostTime = false;  // live: messages carry the host's time
    };
    // Called for every log packet or event that wrote events (events non-empty).
    using EventSink = std::function<void(DecodedPacket&)>;
    // Called for every frame that is not a log packet, event report or multi-SIM wrapper
    // (command responses), with its packet (unescaped, CRC removed).
    using ResponseSink = std::function<void(std::span<const std::uint8_t> packet)>;

    // (Two constructors: g++ takes no default argument of a nested class with member
    // initialisers inside the enclosing class.)
    DiagStream();
    explicit DiagStream(Options options);
    // Moves, no copies (it keeps a pointer into its own counts).
    DiagStream(DiagStream&&) = default;
    DiagStream& operator=(DiagStream&&) = default;
    DiagStream(const DiagStream&) = delete;
    DiagStream& operator=(const DiagStream&) = delete;
    ~DiagStream() = default;

    void feed(std::span<const std::uint8_t> bytes, const EventSink& onEvents,
              const ResponseSink& onResponse = {});
    // The input has ended: a frame begun is counted as cut short.
    void finish();
    // A port reopened: a frame begun is forgotten (the decoders' state is kept).
    void reset();

    [[nodiscard]] const StreamStats& stats() const { return stats_; }

    // The log codes the decoder tables take (each once, sorted): the live session's log mask.
    [[nodiscard]] static std::span<const std::uint16_t> decodedLogCodes();

  private:
    void onPacket(std::span<const std::uint8_t> packet, const EventSink& onEvents,
                  const ResponseSink& onResponse);
    // The packet of a frame, or the inner packet of a multi-SIM frame of the first subscription.
    void dispatch(std::span<const std::uint8_t> packet, const EventSink& onEvents,
                  const ResponseSink& onResponse);
    void logPacket(std::span<const std::uint8_t> packet, const EventSink& onEvents);
    void eventReport(std::span<const std::uint8_t> packet, const EventSink& onEvents);
    void decodeEvent(const EventReport& event, const EventSink& onEvents);
    // The time messages carry for a packet whose own time (ms since 1970) is modemMs.
    [[nodiscard]] std::uint64_t messageTime(std::uint64_t modemMs, bool clockSet) const;
    [[nodiscard]] StreamStats::Counts& logCounts(std::uint16_t code, int version);

    Options options_;
    Deframer deframer_;
    DecodeState state_;
    StreamStats stats_;
    std::optional<std::uint32_t> subscription_;  // the first one seen: the one decoded
    std::uint64_t lastModemMs_ = 0;  // the last full modem time (for truncated event times)
    DecodedPacket decoded_;          // reused: its events' buffer stays allocated
    // The last (code, version) counted, most packets being of a few kinds.
    std::uint32_t lastLogKey_ = ~std::uint32_t{0};
    StreamStats::Counts* lastLogCounts_ = nullptr;
};

// The modem's 1.25 ms ticks since 1980-01-06 (upper 48 bits of a log timestamp) as ms since
// 1970; 0 for a timestamp of 0.
[[nodiscard]] std::uint64_t modemTimeMs(std::uint64_t timestamp);

// The fields of a log packet (0x10) whose declared lengths match its size (timeMs left 0), or
// nothing; the payload points into packet.
[[nodiscard]] std::optional<LogPacket> readLogPacket(std::span<const std::uint8_t> packet);

// The subscription and inner packet of a multi-SIM packet (98 01 00 00, u32 subscription, a
// packet of at least one byte), or nothing.
struct MultiSimPacket {
    std::uint32_t subscription = 0;
    std::span<const std::uint8_t> inner;
};
[[nodiscard]] std::optional<MultiSimPacket> readMultiSim(std::span<const std::uint8_t> packet);

// Packets as a modem writes them (for the fake modem in the tests, the benchmarks and the fuzz
// seeds): a log packet (0x10, lengths, code, timestamp, payload), an event report (0x60) of
// events, and a multi-SIM wrapper (0x98 01 00 00, u32 subscription, the inner packet).
[[nodiscard]] Bytes logPacket(std::uint16_t code, std::uint64_t timestamp,
                              std::span<const std::uint8_t> payload);
struct WrittenEvent {
    std::uint16_t id = 0;
    std::uint64_t timestamp = 0;
    Bytes payload;  // 0, 1 or 2 bytes inline, longer ones (up to 255) length-prefixed
    // Written in the 2-byte truncated form (bits 16-31 of timestamp) instead of the whole u64.
    bool truncatedTime = false;
};
[[nodiscard]] Bytes eventReport(std::span<const WrittenEvent> events);
[[nodiscard]] Bytes multiSim(std::uint32_t subscription, std::span<const std::uint8_t> inner);

}  // namespace pyx::diag
