#include "sources/diag/stream/DiagStream.h"

#include <algorithm>
#include <cstring>

namespace pyx::diag {

namespace {

constexpr std::uint8_t kLogCommand = 0x10;
constexpr std::uint8_t kEventCommand = 0x60;
constexpr std::uint8_t kMultiSimCommand = 0x98;
constexpr std::size_t kLogHeader = 16;      // command, more, 2 lengths, code, timestamp
constexpr std::size_t kMultiSimHeader = 8;  // 98 01 00 00, u32 subscription
constexpr std::size_t kEventHeader = 3;     // command, u16 length

// 1980-01-06 00:00:00 (the modem's epoch) in seconds since 1970.
constexpr std::uint64_t kModemEpochS = 315964800;
// A modem time before 2000-01-01 means its clock is not set (it counts from 1980 at power-on).
constexpr std::uint64_t kClockSetFromMs = 946684800000ULL;

std::uint16_t u16At(std::span<const std::uint8_t> bytes, std::size_t at) {
    return static_cast<std::uint16_t>(bytes[at] | bytes[at + 1] << 8);
}

std::uint32_t u32At(std::span<const std::uint8_t> bytes, std::size_t at) {
    return static_cast<std::uint32_t>(u16At(bytes, at)) |
           static_cast<std::uint32_t>(u16At(bytes, at + 2)) << 16;
}

std::uint64_t u64At(std::span<const std::uint8_t> bytes, std::size_t at) {
    return static_cast<std::uint64_t>(u32At(bytes, at)) |
           static_cast<std::uint64_t>(u32At(bytes, at + 4)) << 32;
}

// (code, version) as one number; version -1 (kAnyVersion, or an empty payload) to 255.
std::uint32_t logKey(std::uint16_t code, int version) {
    return static_cast<std::uint32_t>(code) << 9 | static_cast<std::uint32_t>(version + 1);
}

// The rows of every log table by (code, version), built once for every stream. A packet takes
// the row of its exact version before one of kAnyVersion; of two rows for the same key, the
// first in table order.
class LogRowIndex {
  public:
    LogRowIndex() {
        for (const std::span<const LogDecoderRow> table : logDecoderTables())
            for (const LogDecoderRow& row : table)
                if (row.version >= kAnyVersion && row.version <= 255)
                    rows_.push_back({logKey(row.code, row.version), &row});
        std::stable_sort(rows_.begin(), rows_.end(),
                         [](const Entry& a, const Entry& b) { return a.key < b.key; });
        rows_.erase(std::unique(rows_.begin(), rows_.end(),
                                [](const Entry& a, const Entry& b) { return a.key == b.key; }),
                    rows_.end());
        for (const Entry& e : rows_) {
            const auto code = static_cast<std::uint16_t>(e.key >> 9);
            if (codes_.empty() || codes_.back() != code) codes_.push_back(code);
        }
    }

    [[nodiscard]] const LogDecoderRow* find(std::uint16_t code, int version) const {
        if (version != kAnyVersion)
            if (const LogDecoderRow* row = exact(logKey(code, version))) return row;
        return exact(logKey(code, kAnyVersion));
    }

    [[nodiscard]] std::span<const std::uint16_t> codes() const { return codes_; }

  private:
    struct Entry {
        std::uint32_t key;
        const LogDecoderRow* row;
    };

    [[nodiscard]] const LogDecoderRow* exact(std::uint32_t key) const {
        const auto it = std::lower_bound(rows_.begin(), rows_.end(), key,
                                         [](const Entry& e, std::uint32_t k) { return e.key < k; });
        return it != rows_.end() && it->key == key ? it->row : nullptr;
    }

    std::vector<Entry> rows_;  // sorted by key
    std::vector<std::uint16_t> codes_;
};

const LogRowIndex& logRows() {
    static const LogRowIndex index;
    return index;
}

// The event rows by id (the first row of an id).
class EventRowIndex {
  public:
    EventRowIndex() {
        for (const EventDecoderRow& row : eventDecoders()) rows_.push_back(&row);
        std::stable_sort(
            rows_.begin(), rows_.end(),
            [](const EventDecoderRow* a, const EventDecoderRow* b) { return a->id < b->id; });
    }

    [[nodiscard]] const EventDecoderRow* find(std::uint16_t id) const {
        const auto it = std::lower_bound(
            rows_.begin(), rows_.end(), id,
            [](const EventDecoderRow* row, std::uint16_t i) { return row->id < i; });
        return it != rows_.end() && (*it)->id == id ? *it : nullptr;
    }

  private:
    std::vector<const EventDecoderRow*> rows_;  // sorted by id
};

const EventRowIndex& eventRows() {
    static const EventRowIndex index;
    return index;
}

}  // namespace

std::uint64_t modemTimeMs(std::uint64_t timestamp) {
    if (timestamp == 0) return 0;
    const std::uint64_t ticks = timestamp >> 16;  // 1.25 ms each
    return kModemEpochS * 1000 + ticks * 5 / 4;
}

std::optional<LogPacket> readLogPacket(std::span<const std::uint8_t> packet) {
    // Both lengths hold the bytes after the first one: the second length, the code, the
    // timestamp and the payload.
    if (packet.size() < kLogHeader || packet[0] != kLogCommand ||
        u16At(packet, 2) != packet.size() - 4 || u16At(packet, 4) != packet.size() - 4)
        return std::nullopt;
    LogPacket log;
    log.code = u16At(packet, 6);
    log.timestamp = u64At(packet, 8);
    log.payload = packet.subspan(kLogHeader);
    return log;
}

std::optional<MultiSimPacket> readMultiSim(std::span<const std::uint8_t> packet) {
    if (packet.size() <= kMultiSimHeader || packet[0] != kMultiSimCommand || packet[1] != 0x01 ||
        packet[2] != 0 || packet[3] != 0)
        return std::nullopt;
    return MultiSimPacket{u32At(packet, 4), packet.subspan(kMultiSimHeader)};
}

DiagStream::DiagStream() = default;

DiagStream::DiagStream(Options options) : options_(std::move(options)) {}

std::span<const std::uint16_t> DiagStream::decodedLogCodes() {
    return logRows().codes();
}

void DiagStream::feed(std::span<const std::uint8_t> bytes, const EventSink& onEvents,
                      const ResponseSink& onResponse) {
    deframer_.feed(bytes, [&](std::span<const std::uint8_t> packet) {
        onPacket(packet, onEvents, onResponse);
    });
    stats_.frames = deframer_.counts();
}

void DiagStream::finish() {
    stats_.cutShort += deframer_.pending();
    deframer_.reset();
    stats_.frames = deframer_.counts();
}

void DiagStream::reset() {
    deframer_.reset();
}

void DiagStream::onPacket(std::span<const std::uint8_t> packet, const EventSink& onEvents,
                          const ResponseSink& onResponse) {
    if (packet[0] != kMultiSimCommand) {
        dispatch(packet, onEvents, onResponse);
        return;
    }
    const auto multiSim = readMultiSim(packet);
    if (!multiSim || multiSim->inner[0] == kMultiSimCommand) {
        ++stats_.malformed;
        return;
    }
    ++stats_.subscriptions[multiSim->subscription];
    if (!subscription_) subscription_ = multiSim->subscription;
    if (*subscription_ == multiSim->subscription) dispatch(multiSim->inner, onEvents, onResponse);
}

void DiagStream::dispatch(std::span<const std::uint8_t> packet, const EventSink& onEvents,
                          const ResponseSink& onResponse) {
    const std::uint8_t command = packet[0];
    if (command == kLogCommand) {
        logPacket(packet, onEvents);
        return;
    }
    // A report without events (60 00 00) is the answer to an event report request.
    if (command == kEventCommand && !(packet.size() == kEventHeader && u16At(packet, 1) == 0)) {
        eventReport(packet, onEvents);
        return;
    }
    ++stats_.otherCommands[command];
    if (onResponse) onResponse(packet);
}

std::uint64_t DiagStream::messageTime(std::uint64_t modemMs, bool clockSet) const {
    if ((options_.hostTime || !clockSet) && options_.now) return options_.now();
    return modemMs;
}

StreamStats::Counts& DiagStream::logCounts(std::uint16_t code, int version) {
    const std::uint32_t key = logKey(code, version);
    if (key != lastLogKey_ || lastLogCounts_ == nullptr) {
        lastLogCounts_ = &stats_.logs[{code, version}];
        lastLogKey_ = key;
    }
    return *lastLogCounts_;
}

void DiagStream::logPacket(std::span<const std::uint8_t> packet, const EventSink& onEvents) {
    auto read = readLogPacket(packet);
    if (!read) {
        ++stats_.malformed;
        return;
    }
    LogPacket& log = *read;
    const std::uint64_t modemMs = modemTimeMs(log.timestamp);
    const bool clockSet = modemMs >= kClockSetFromMs;
    if (clockSet) {
        if (!stats_.firstTimeMs) stats_.firstTimeMs = modemMs;
        stats_.lastTimeMs = modemMs;
        lastModemMs_ = modemMs;
    }
    log.timeMs = messageTime(modemMs, clockSet);

    const int version = log.payload.empty() ? -1 : log.payload[0];
    StreamStats::Counts& counts = logCounts(log.code, version);
    const LogDecoderRow* row = logRows().find(log.code, version);
    decoded_.events.clear();
    if (row == nullptr || !row->decode(log, state_, decoded_.events)) {
        ++counts.notDecoded;
        return;
    }
    ++counts.decoded;
    if (decoded_.events.empty() || !onEvents) return;
    decoded_.modemTimeMs = clockSet ? modemMs : 0;
    onEvents(decoded_);
}

void DiagStream::eventReport(std::span<const std::uint8_t> packet, const EventSink& onEvents) {
    if (packet.size() < kEventHeader || u16At(packet, 1) != packet.size() - kEventHeader) {
        ++stats_.malformed;
        return;
    }
    std::size_t at = kEventHeader;
    while (at < packet.size()) {
        const std::size_t left = packet.size() - at;
        if (left < 2) break;
        const std::uint16_t word = u16At(packet, at);
        const bool truncatedTime = (word & 0x8000) != 0;
        const std::size_t timeSize = truncatedTime ? 2 : 8;
        const unsigned payloadCode = word >> 13 & 0x3;
        std::size_t payloadAt = 2 + timeSize;
        if (left < payloadAt) break;
        std::size_t payloadSize = payloadCode;  // 0, 1 or 2 bytes inline
        if (payloadCode == 3) {
            if (left < payloadAt + 1) break;
            payloadSize = packet[at + payloadAt];
            ++payloadAt;
        }
        if (left - payloadAt < payloadSize) break;

        EventReport event;
        event.id = static_cast<std::uint16_t>(word & 0x0FFF);
        event.payload = packet.subspan(at + payloadAt, payloadSize);
        // A truncated time is taken as the last full one the stream carried.
        std::uint64_t modemMs = lastModemMs_;
        bool clockSet = modemMs != 0;
        if (!truncatedTime) {
            modemMs = modemTimeMs(u64At(packet, at + 2));
            clockSet = modemMs >= kClockSetFromMs;
            if (clockSet) lastModemMs_ = modemMs;
        }
        event.timeMs = messageTime(modemMs, clockSet);
        decoded_.modemTimeMs = clockSet ? modemMs : 0;
        decodeEvent(event, onEvents);
        at += payloadAt + payloadSize;
    }
    if (at != packet.size()) ++stats_.malformed;
}

void DiagStream::decodeEvent(const EventReport& event, const EventSink& onEvents) {
    StreamStats::Counts& counts = stats_.events[event.id];
    const EventDecoderRow* row = eventRows().find(event.id);
    decoded_.events.clear();
    if (row == nullptr || !row->decode(event, state_, decoded_.events)) {
        ++counts.notDecoded;
        return;
    }
    ++counts.decoded;
    if (!decoded_.events.empty() && onEvents) onEvents(decoded_);
}

}  // namespace pyx::diag
