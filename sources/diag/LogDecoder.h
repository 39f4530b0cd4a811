// What a DIAG decoder sees and what it writes. The decoders are tables, one per technology,
// keyed by (log code, version); each row turns one log packet (or event report) into zero or
// more metric events written with our message classes under their catalogue IDs, as the
// simulated baseband writes them. A packet no row fits is counted, never guessed at.
#pragma once

#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "core/Value.h"

namespace pyx::diag {

struct DecodeState;  // sources/diag/DecodeState.h

// One log packet (command 0x10, possibly unwrapped from a multi-SIM 0x98 frame).
struct LogPacket {
    std::uint16_t code = 0;
    // The modem's own time: 1.25 ms ticks since 1980-01-06 00:00:00 in the upper 48 bits.
    std::uint64_t timestamp = 0;
    // The time our messages carry (ms since 1970): the packet's own, or the host's when the
    // modem's clock is unset.
    std::uint64_t timeMs = 0;
    // The bytes after the 16-byte log header; usually starts with a version byte.
    std::span<const std::uint8_t> payload;
};

// One event of an event report (command 0x60).
struct EventReport {
    std::uint16_t id = 0;  // b0-11 of the event word
    std::uint64_t timeMs = 0;
    std::span<const std::uint8_t> payload;
};

// A metric event a decoder writes.
struct MetricOut {
    std::int64_t metricID = 0;  // the catalogue's ID (core/MetricKindList.h)
    Bytes payload;              // written with that kind's message class
};

// A decoder returns false when the packet does not fit its layout (too short, a count past
// the end, a sub-packet version it does not know); the packet is then counted as not decoded
// and nothing it wrote is kept.
using LogDecodeFn = bool (*)(const LogPacket& packet, DecodeState& state,
                             std::vector<MetricOut>& out);
using EventDecodeFn = bool (*)(const EventReport& event, DecodeState& state,
                               std::vector<MetricOut>& out);

// The version of a row whose layout has no version byte (or keeps it elsewhere, as 0x4005).
inline constexpr int kAnyVersion = -1;

struct LogDecoderRow {
    std::uint16_t code;
    int version;  // payload[0], or kAnyVersion
    std::string_view name;
    LogDecodeFn decode;
};

struct EventDecoderRow {
    std::uint16_t id;
    std::string_view name;
    EventDecodeFn decode;
};

// The tables, by technology (sources/diag/<technology>/*Decoders.cpp); LTE has one per area.
[[nodiscard]] std::span<const LogDecoderRow> lteServingDecoders();    // serving cell, idle meas
[[nodiscard]] std::span<const LogDecoderRow> lteConnectedDecoders();  // connected meas, CA
[[nodiscard]] std::span<const LogDecoderRow> lteRrcDecoders();        // RRC state (OTA header)
[[nodiscard]] std::span<const LogDecoderRow> lteTxPowerDecoders();
[[nodiscard]] std::span<const LogDecoderRow> umtsDecoders();
[[nodiscard]] std::span<const LogDecoderRow> gsmDecoders();
[[nodiscard]] std::span<const LogDecoderRow> nasDecoders();
[[nodiscard]] std::span<const EventDecoderRow> eventDecoders();  // lte/LteRrcDecoders.cpp

// Every log table above, for the stream (sources/diag/DecoderTables.cpp).
[[nodiscard]] std::span<const std::span<const LogDecoderRow>> logDecoderTables();

}  // namespace pyx::diag
