#include "tests/sources/diag/umts/DecoderHarness.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <iterator>
#include <string_view>
#include <variant>

#include "metrics/MetricCatalogue.h"
#include "sources/diag/frame/Hdlc.h"
#include "sources/diag/stream/DiagStream.h"
#include "tests/sources/diag/support/DiagVectors.h"

namespace pyx::diag::test {

const LogDecoderRow* rowFor(std::span<const LogDecoderRow> table, std::uint16_t code,
                            std::span<const std::uint8_t> payload) {
    for (const LogDecoderRow& row : table) {
        if (row.code != code) continue;
        if (row.version == kAnyVersion) return &row;
        if (!payload.empty() && row.version == payload[0]) return &row;
    }
    return nullptr;
}

Decoded decode(std::span<const LogDecoderRow> table, std::uint16_t code,
               std::span<const std::uint8_t> payload, DecodeState& state, std::uint64_t timeMs) {
    Decoded result;
    const LogDecoderRow* row = rowFor(table, code, payload);
    if (row == nullptr) return result;
    LogPacket packet;
    packet.code = code;
    packet.timeMs = timeMs;
    packet.payload = payload;
    result.decoded = row->decode(packet, state, result.events);
    return result;
}

std::size_t countOf(const std::vector<MetricOut>& events, std::int64_t metricID) {
    std::size_t n = 0;
    for (const MetricOut& e : events) n += e.metricID == metricID ? 1 : 0;
    return n;
}

Dict eventOf(const std::vector<MetricOut>& events, std::int64_t metricID) {
    EXPECT_EQ(countOf(events, metricID), 1U) << std::hex << metricID;
    for (const MetricOut& e : events) {
        if (e.metricID != metricID) continue;
        const MetricKind* kind = findMetricKind(metricID);
        if (kind == nullptr || !kind->decodable()) {
            ADD_FAILURE() << "not a decoded kind: " << std::hex << metricID;
            return {};
        }
        auto decoded = kind->decode(e.payload);
        if (const auto* dict = std::get_if<Dict>(&decoded)) return *dict;
        ADD_FAILURE() << "does not decode as " << kind->messageClass;
    }
    return {};
}

void feed(const std::shared_ptr<MetricValidator>& store, const std::vector<MetricOut>& events) {
    for (const MetricOut& e : events) {
        Dict record;
        record.append("kKeyMetricID", Value(e.metricID));
        record.append("kKeyPayload", Value(e.payload));
        EXPECT_TRUE(store->isMetricIDValidWithMetricdict(record)) << std::hex << e.metricID;
    }
}

namespace {

// A deterministic source of noise (xorshift32), so that a failing payload comes again.
class Noise {
  public:
    explicit Noise(std::uint32_t seed) : seed_(seed) {}
    // length bytes; with small, each below limit (where counts and arguments lie).
    Bytes payload(std::size_t length, bool small, std::uint32_t limit) {
        Bytes bytes(length);
        for (std::uint8_t& b : bytes)
            b = static_cast<std::uint8_t>(small ? next() % limit : next());
        return bytes;
    }

  private:
    std::uint32_t next() {
        seed_ ^= seed_ << 13;
        seed_ ^= seed_ >> 17;
        seed_ ^= seed_ << 5;
        return seed_;
    }
    std::uint32_t seed_;
};

// Whatever a row wrote must decode as its kind's class.
void expectDecodable(std::string_view row, const std::vector<MetricOut>& events) {
    for (const MetricOut& e : events) {
        const MetricKind* kind = findMetricKind(e.metricID);
        if (kind == nullptr || !kind->decodable()) {
            ADD_FAILURE() << row << " wrote an unknown kind " << e.metricID;
            continue;
        }
        EXPECT_TRUE(std::holds_alternative<Dict>(kind->decode(e.payload)))
            << row << ": " << kind->messageClass;
    }
}

}  // namespace

std::size_t feedNoise(std::span<const LogDecoderRow> table) {
    Noise noise(0x2545F491);
    std::size_t taken = 0;
    DecodeState state;
    for (const LogDecoderRow& row : table) {
        for (std::size_t length = 0; length <= 300; ++length) {
            for (int round = 0; round < 8; ++round) {
                // Small counts now and then, so that some packets hold all their cells.
                Bytes payload = noise.payload(length, round % 2 != 0, 4);
                if (!payload.empty() && row.version != kAnyVersion)
                    payload[0] = static_cast<std::uint8_t>(row.version);
                const Decoded d = decode(table, row.code, payload, state);
                if (!d.decoded) continue;
                ++taken;
                expectDecodable(row.name, d.events);
            }
        }
    }
    return taken;
}

std::string text(const Dict& dict, const std::string& key) {
    const Value* v = dict.find(key);
    return v == nullptr ? std::string() : v->description();
}

std::size_t lengthOf(const Dict& dict, const std::string& list) {
    const Value* v = dict.find(list);
    return v != nullptr && v->isArray() ? v->asArray().size() : 0;
}

const Dict& element(const Dict& dict, const std::string& list, std::size_t index) {
    static const Dict kEmpty;
    const Value* v = dict.find(list);
    if (v == nullptr || !v->isArray() || index >= v->asArray().size() ||
        !v->asArray()[index].isDict()) {
        ADD_FAILURE() << "no element " << index << " in " << list;
        return kEmpty;
    }
    return v->asArray()[index].asDict();
}

std::vector<Bytes> capturePayloads(const std::string& file, std::uint16_t code) {
    std::vector<Bytes> payloads;
    for (CapturedPacket& packet : capturePackets(file, std::span(&code, 1)))
        payloads.push_back(std::move(packet.payload));
    return payloads;
}

std::vector<CapturedPacket> capturePackets(const std::string& file,
                                           std::span<const std::uint16_t> codes) {
    std::ifstream in(sharedDiag() / "captures" / file, std::ios::binary);
    const Bytes raw{std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
    std::vector<CapturedPacket> packets;
    // Frames with a bad CRC are skipped; log packets of every subscription are taken.
    Deframer deframer;
    deframer.feed(raw, [&](std::span<const std::uint8_t> packet) {
        if (const auto multiSim = readMultiSim(packet)) packet = multiSim->inner;
        const auto log = readLogPacket(packet);
        if (log && std::find(codes.begin(), codes.end(), log->code) != codes.end())
            packets.push_back(
                {log->code, Bytes(log->payload.begin(), log->payload.end()), log->timestamp});
    });
    return packets;
}

const EventDecoderRow* eventRowFor(std::span<const EventDecoderRow> table, std::uint16_t id) {
    for (const EventDecoderRow& row : table)
        if (row.id == id) return &row;
    return nullptr;
}

Decoded decodeEvent(std::span<const EventDecoderRow> table, std::uint16_t id,
                    std::span<const std::uint8_t> payload, DecodeState& state,
                    std::uint64_t timeMs) {
    Decoded result;
    const EventDecoderRow* row = eventRowFor(table, id);
    if (row == nullptr) return result;
    EventReport event;
    event.id = id;
    event.timeMs = timeMs;
    event.payload = payload;
    result.decoded = row->decode(event, state, result.events);
    return result;
}

std::size_t feedEventNoise(std::span<const EventDecoderRow> table) {
    Noise noise(0x9E3779B9);
    std::size_t taken = 0;
    DecodeState state;
    for (const EventDecoderRow& row : table) {
        for (std::size_t length = 0; length <= 40; ++length) {
            for (int round = 0; round < 64; ++round) {
                // Small values now and then, where the rows' arguments lie.
                const Bytes payload = noise.payload(length, round % 2 != 0, 8);
                const Decoded d = decodeEvent(table, row.id, payload, state, kTimeMs + 10U * taken);
                if (!d.decoded) continue;
                ++taken;
                expectDecodable(row.name, d.events);
            }
        }
    }
    return taken;
}

std::vector<CapturedEvent> captureEvents(const std::string& file,
                                         std::span<const std::uint16_t> ids) {
    std::ifstream in(sharedDiag() / "captures" / file, std::ios::binary);
    const Bytes raw{std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
    std::vector<CapturedEvent> events;
    Deframer deframer;
    deframer.feed(raw, [&](std::span<const std::uint8_t> packet) {
        if (const auto multiSim = readMultiSim(packet)) packet = multiSim->inner;
        if (packet.empty() || packet[0] != 0x60) return;
        static_cast<void>(readEventReport(packet, [&](const ReportedEvent& event) {
            if (std::find(ids.begin(), ids.end(), event.id) != ids.end())
                events.push_back({event.id, Bytes(event.payload.begin(), event.payload.end())});
        }));
    });
    return events;
}

}  // namespace pyx::diag::test
