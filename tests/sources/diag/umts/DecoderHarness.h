// Running the UMTS, GSM and NAS decoder tables in tests: one payload through the row its code
// and version select, the events it writes decoded back through the catalogue or fed to a
// store, and the log packets of a capture in ../shared/diag/captures.
#pragma once

#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <vector>

#include "core/Value.h"
#include "metrics/MetricValidator.h"
#include "sources/diag/DecodeState.h"
#include "sources/diag/LogDecoder.h"

namespace pyx::diag::test {

inline constexpr std::uint64_t kTimeMs = 1600000000123ULL;

// The row of table that takes a packet of code with this payload, or nullptr.
[[nodiscard]] const LogDecoderRow* rowFor(std::span<const LogDecoderRow> table, std::uint16_t code,
                                          std::span<const std::uint8_t> payload);

struct Decoded {
    bool decoded = false;  // false: no row, or the row refused the packet
    std::vector<MetricOut> events;
};

// Runs payload through the row of table for code, with state carried by the caller, at the
// packet time timeMs.
[[nodiscard]] Decoded decode(std::span<const LogDecoderRow> table, std::uint16_t code,
                             std::span<const std::uint8_t> payload, DecodeState& state,
                             std::uint64_t timeMs = kTimeMs);

// The dictionary form of the one event of metricID among events (fails the test otherwise).
[[nodiscard]] Dict eventOf(const std::vector<MetricOut>& events, std::int64_t metricID);
[[nodiscard]] std::size_t countOf(const std::vector<MetricOut>& events, std::int64_t metricID);

// Feeds every event to store as the intake would take it from a source.
void feed(const std::shared_ptr<MetricValidator>& store, const std::vector<MetricOut>& events);

// Feeds every row of table pseudo-random payloads of every length up to 300 bytes (the first
// byte set to the row's version where it has one), with one state carried throughout: none
// may read past its payload (ASan sees to it), and whatever a row writes must decode as its
// kind's class. Returns how many payloads the rows took.
std::size_t feedNoise(std::span<const LogDecoderRow> table);

// A value of a dictionary as text ("" when absent), and the i-th element of a list in it.
[[nodiscard]] std::string text(const Dict& dict, const std::string& key);
[[nodiscard]] const Dict& element(const Dict& dict, const std::string& list, std::size_t index);
[[nodiscard]] std::size_t lengthOf(const Dict& dict, const std::string& list);

// The payloads (bytes after the 16-byte log header) of every log packet of code in a capture
// of ../shared/diag/captures, in stream order; frames with a bad CRC are skipped.
[[nodiscard]] std::vector<Bytes> capturePayloads(const std::string& file, std::uint16_t code);

// The log packets of any of codes in a capture, in stream order.
struct CapturedPacket {
    std::uint16_t code = 0;
    Bytes payload;
    std::uint64_t timestamp = 0;  // the log header's: 1.25 ms ticks since 1980 in b16-63
};
[[nodiscard]] std::vector<CapturedPacket> capturePackets(const std::string& file,
                                                         std::span<const std::uint16_t> codes);

// Event rows (eventDecoders()), as the log rows above: the row of table for an event id, or
// nullptr; an event's payload run through it (at kTimeMs, or at timeMs), with state carried by
// the caller; and pseudo-random payloads of every length up to 40 bytes through every row,
// with one state carried throughout (none may read past its payload, and whatever a row writes
// must decode as its kind's class), returning how many the rows took.
[[nodiscard]] const EventDecoderRow* eventRowFor(std::span<const EventDecoderRow> table,
                                                 std::uint16_t id);
[[nodiscard]] Decoded decodeEvent(std::span<const EventDecoderRow> table, std::uint16_t id,
                                  std::span<const std::uint8_t> payload, DecodeState& state,
                                  std::uint64_t timeMs = kTimeMs);
std::size_t feedEventNoise(std::span<const EventDecoderRow> table);

// The events of any of ids in the event reports (command 0x60) of a capture, in stream order:
// each event's id (b0-11 of its word) and payload (none, 1 or 2 bytes as b13-14 say, or
// length-prefixed), after a 2-byte (b15 set) or 8-byte timestamp.
struct CapturedEvent {
    std::uint16_t id = 0;
    Bytes payload;
};
[[nodiscard]] std::vector<CapturedEvent> captureEvents(const std::string& file,
                                                       std::span<const std::uint16_t> ids);

}  // namespace pyx::diag::test
