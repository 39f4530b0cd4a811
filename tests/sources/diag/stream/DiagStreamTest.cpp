// The DIAG stream as its user sees it: the metric events the decoders write from a byte stream,
// with the times they carry, the responses handed on, and what the stream counted (log packets
// by code and version, events, subscriptions, malformed packets, a frame cut short).
#include <gtest/gtest.h>

#include <algorithm>
#include <set>
#include <variant>
#include <vector>

#include "metrics/MetricCatalogue.h"
#include "sources/diag/decode/ByteReader.h"
#include "sources/diag/stream/DiagStream.h"

namespace pyx::diag::test {
namespace {

namespace id = decode::id;

// 2000-01-01 00:00:00 UTC, and the modem's timestamp for it (1.25 ms ticks since 1980-01-06
// in the upper 48 bits).
constexpr std::uint64_t kY2000Ms = 946684800000ULL;
constexpr std::uint64_t kY2000Ticks = (kY2000Ms - 315964800000ULL) * 4 / 5;
constexpr std::uint64_t kY2000Stamp = kY2000Ticks << 16;
constexpr std::uint64_t kHostMs = 1700000000000ULL;

constexpr std::uint16_t kCellId = 0x4127;        // WCDMA cell ID: 32 bytes, any version
constexpr std::uint16_t kNoRow = 0x1FFE;         // a code no table has
constexpr std::uint64_t kSecond = 800ULL << 16;  // one second of ticks

// A WCDMA cell ID payload: UARFCN 10700, PSC 300, PLMN 262-01, LAC 0x1234.
Bytes cellIdPayload(std::uint8_t first = 0x00) {
    Bytes p(32, 0);
    p[0] = first;
    p[4] = 10700 & 0xFF;
    p[5] = 10700 >> 8;
    p[16] = static_cast<std::uint8_t>((300 << 4) & 0xFF);
    p[17] = static_cast<std::uint8_t>(300 >> 4);
    const std::uint8_t plmn[6] = {2, 6, 2, 0, 1, 0x0F};
    std::copy(std::begin(plmn), std::end(plmn), p.begin() + 18);
    p[24] = 0x34;
    p[25] = 0x12;
    return p;
}

struct Outcome {
    std::vector<DecodedPacket> packets;
    std::vector<Bytes> responses;
    StreamStats stats;
};

Bytes framed(std::initializer_list<Bytes> packets) {
    Bytes stream;
    for (const Bytes& p : packets) appendFrame(p, stream);
    return stream;
}

Outcome runStream(std::span<const std::uint8_t> stream, DiagStream::Options options = {},
                  std::size_t piece = 0) {
    DiagStream diag(std::move(options));
    Outcome out;
    const auto onEvents = [&](DecodedPacket& p) { out.packets.push_back(p); };
    const auto onResponse = [&](std::span<const std::uint8_t> r) {
        out.responses.emplace_back(r.begin(), r.end());
    };
    if (piece == 0) piece = std::max<std::size_t>(stream.size(), 1);
    for (std::size_t at = 0; at < stream.size(); at += piece)
        diag.feed(stream.subspan(at, std::min(piece, stream.size() - at)), onEvents, onResponse);
    diag.finish();
    out.stats = diag.stats();
    return out;
}

// The "timestamp" a metric event's message carries.
std::uint64_t messageTime(const MetricOut& event) {
    const MetricKind* kind = findMetricKind(event.metricID);
    if (kind == nullptr || !kind->decodable()) {
        ADD_FAILURE() << "not a decoded kind: " << event.metricID;
        return 0;
    }
    const auto decoded = kind->decode(event.payload);
    const Dict* dict = std::get_if<Dict>(&decoded);
    const Value* time = dict != nullptr ? dict->find("timestamp") : nullptr;
    if (time == nullptr || !time->isUInt()) {
        ADD_FAILURE() << "no timestamp in " << kind->messageClass;
        return 0;
    }
    return time->asUInt();
}

StreamStats::Counts logsOf(const StreamStats& stats, std::uint16_t code, int version) {
    const auto it = stats.logs.find({code, version});
    return it == stats.logs.end() ? StreamStats::Counts{} : it->second;
}

TEST(ModemTime, TicksOfOneAndAQuarterMillisecondSince1980) {
    EXPECT_EQ(modemTimeMs(0), 0U);
    EXPECT_EQ(modemTimeMs(kY2000Stamp), kY2000Ms);
    EXPECT_EQ(modemTimeMs(kY2000Stamp | 0xFFFF), kY2000Ms);  // the fraction of a tick
    EXPECT_EQ(modemTimeMs(kY2000Stamp + (4ULL << 16)), kY2000Ms + 5);
    EXPECT_EQ(modemTimeMs(1ULL << 16), 315964800001ULL);  // 1980-01-06, 1.25 ms in
}

TEST(DiagStream, LogPacketsAreCountedByCodeAndVersion) {
    const Bytes v3 = {3, 1, 2}, v4 = {4};
    const Outcome r =
        runStream(framed({logPacket(kNoRow, kY2000Stamp, v3), logPacket(kNoRow, kY2000Stamp, v3),
                          logPacket(kNoRow, kY2000Stamp, v4), logPacket(kNoRow, kY2000Stamp, {})}));
    EXPECT_TRUE(r.packets.empty());
    EXPECT_EQ(r.stats.logs.size(), 3U);
    EXPECT_EQ(logsOf(r.stats, kNoRow, 3).notDecoded, 2U);
    EXPECT_EQ(logsOf(r.stats, kNoRow, 4).notDecoded, 1U);
    EXPECT_EQ(logsOf(r.stats, kNoRow, -1).notDecoded, 1U);  // an empty payload
    EXPECT_EQ(r.stats.frames.frames, 4U);
    EXPECT_EQ(r.stats.malformed, 0U);
}

TEST(DiagStream, ARowOfAnyVersionTakesEveryVersion) {
    const Outcome r = runStream(framed({logPacket(kCellId, kY2000Stamp, cellIdPayload(0x00)),
                                        logPacket(kCellId, kY2000Stamp, cellIdPayload(0x07)),
                                        logPacket(kCellId, kY2000Stamp, cellIdPayload(0xFF))}));
    EXPECT_EQ(logsOf(r.stats, kCellId, 0x00).decoded, 1U);
    EXPECT_EQ(logsOf(r.stats, kCellId, 0x07).decoded, 1U);
    EXPECT_EQ(logsOf(r.stats, kCellId, 0xFF).decoded, 1U);
    ASSERT_EQ(r.packets.size(), 3U);
    for (const DecodedPacket& p : r.packets) {
        ASSERT_EQ(p.events.size(), 1U);
        EXPECT_EQ(p.events[0].metricID, id::K_UMTS_SCELL_INFO);
    }
}

TEST(DiagStream, ARowThatRefusesAPacketWritesNothing) {
    // Too short for a cell ID: the row refuses it.
    const Bytes shortPayload(10, 0x01);
    const Outcome r = runStream(framed({logPacket(kCellId, kY2000Stamp, shortPayload)}));
    EXPECT_TRUE(r.packets.empty());
    EXPECT_EQ(logsOf(r.stats, kCellId, 0x01).notDecoded, 1U);
    EXPECT_EQ(logsOf(r.stats, kCellId, 0x01).decoded, 0U);
}

TEST(DiagStream, MessagesCarryTheModemsTime) {
    DiagStream::Options options;
    options.now = [] { return kHostMs; };
    const Outcome r =
        runStream(framed({logPacket(kCellId, kY2000Stamp, cellIdPayload()),
                          logPacket(kCellId, kY2000Stamp + 60 * kSecond, cellIdPayload())}),
                  options);
    ASSERT_EQ(r.packets.size(), 2U);
    EXPECT_EQ(r.packets[0].modemTimeMs, kY2000Ms);
    EXPECT_EQ(messageTime(r.packets[0].events[0]), kY2000Ms);
    EXPECT_EQ(r.packets[1].modemTimeMs, kY2000Ms + 60000);
    EXPECT_EQ(messageTime(r.packets[1].events[0]), kY2000Ms + 60000);
    EXPECT_EQ(r.stats.firstTimeMs, kY2000Ms);
    EXPECT_EQ(r.stats.lastTimeMs, kY2000Ms + 60000);
}

TEST(DiagStream, LiveMessagesCarryTheHostsTime) {
    DiagStream::Options options;
    options.now = [] { return kHostMs; };
    options.hostTime = true;
    const Outcome r =
        runStream(framed({logPacket(kCellId, kY2000Stamp, cellIdPayload())}), options);
    ASSERT_EQ(r.packets.size(), 1U);
    EXPECT_EQ(r.packets[0].modemTimeMs, kY2000Ms);  // the packet's own, still
    EXPECT_EQ(messageTime(r.packets[0].events[0]), kHostMs);
}

TEST(DiagStream, AModemWithoutAClockGetsTheHostsTime) {
    // A few minutes after 1980-01-06: the modem's clock is not set.
    const std::uint64_t unset = 200 * kSecond;
    DiagStream::Options options;
    options.now = [] { return kHostMs; };
    const Outcome r = runStream(framed({logPacket(kCellId, unset, cellIdPayload())}), options);
    ASSERT_EQ(r.packets.size(), 1U);
    EXPECT_EQ(r.packets[0].modemTimeMs, 0U);
    EXPECT_EQ(messageTime(r.packets[0].events[0]), kHostMs);
    EXPECT_FALSE(r.stats.firstTimeMs);
    EXPECT_FALSE(r.stats.lastTimeMs);

    // Without a host clock the packet's own time is all there is.
    const Outcome own = runStream(framed({logPacket(kCellId, unset, cellIdPayload())}));
    ASSERT_EQ(own.packets.size(), 1U);
    EXPECT_EQ(messageTime(own.packets[0].events[0]), modemTimeMs(unset));
}

TEST(DiagStream, LogPacketsWhoseLengthsDoNotFitAreMalformed) {
    Bytes longer = logPacket(kCellId, kY2000Stamp, cellIdPayload());
    longer[2] = static_cast<std::uint8_t>(longer[2] + 1);  // length A past the frame
    longer[4] = static_cast<std::uint8_t>(longer[4] + 1);
    Bytes shorter = logPacket(kCellId, kY2000Stamp, cellIdPayload());
    shorter[2] = static_cast<std::uint8_t>(shorter[2] - 1);  // the frame holds more
    shorter[4] = static_cast<std::uint8_t>(shorter[4] - 1);
    Bytes differ = logPacket(kCellId, kY2000Stamp, cellIdPayload());
    differ[4] = static_cast<std::uint8_t>(differ[4] + 1);                   // length B alone
    const Bytes header = {0x10, 0x00, 0x0C, 0x00, 0x0C, 0x00, 0x27, 0x41};  // cut in the header
    const Outcome r = runStream(framed(
        {longer, shorter, differ, header, logPacket(kCellId, kY2000Stamp, cellIdPayload())}));
    EXPECT_EQ(r.stats.malformed, 4U);
    EXPECT_EQ(r.packets.size(), 1U);
    EXPECT_EQ(logsOf(r.stats, kCellId, 0).decoded, 1U);
    EXPECT_EQ(r.stats.logs.size(), 1U);
}

TEST(DiagStream, OtherPacketsGoToTheResponsesAndAreCountedByCommand) {
    const Bytes version = {0x00, 'A', 'p', 'r'};
    const Bytes build = {0x7C, 0x01, 0x00, 0x00};
    const Bytes logConfig = {0x73, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0};
    const Bytes eventsOn = {0x60, 0x00, 0x00};  // the answer to 60 01: a report of no events
    const Bytes f3 = {0x79, 0x00, 0x01};
    const Outcome r = runStream(framed({version, build, logConfig, eventsOn, f3, f3}));
    EXPECT_EQ(r.responses, (std::vector<Bytes>{version, build, logConfig, eventsOn, f3, f3}));
    EXPECT_EQ(r.stats.otherCommands, (std::map<std::uint8_t, std::uint64_t>{
                                         {0x00, 1}, {0x7C, 1}, {0x73, 1}, {0x60, 1}, {0x79, 2}}));
    EXPECT_TRUE(r.stats.logs.empty());
    EXPECT_TRUE(r.stats.events.empty());
}

TEST(DiagStream, TheFirstSubscriptionIsDecodedTheOthersCounted) {
    const Bytes cell = logPacket(kCellId, kY2000Stamp, cellIdPayload());
    const Bytes other = logPacket(kNoRow, kY2000Stamp, Bytes{9});
    const Bytes response = {0x7D, 0x05, 0x01, 0x00};
    const Outcome r =
        runStream(framed({multiSim(2, cell), multiSim(1, cell), multiSim(2, other),
                          multiSim(1, other), multiSim(2, response), multiSim(1, response), cell}));
    EXPECT_EQ(r.stats.subscriptions, (std::map<std::uint32_t, std::uint64_t>{{2, 3}, {1, 3}}));
    // Subscription 2 came first: its packets and the unwrapped one are decoded.
    EXPECT_EQ(r.packets.size(), 2U);
    EXPECT_EQ(logsOf(r.stats, kCellId, 0).decoded, 2U);
    EXPECT_EQ(logsOf(r.stats, kNoRow, 9).notDecoded, 1U);
    EXPECT_EQ(r.responses, (std::vector<Bytes>{response}));
    EXPECT_EQ(r.stats.otherCommands, (std::map<std::uint8_t, std::uint64_t>{{0x7D, 1}}));
    EXPECT_EQ(r.stats.malformed, 0U);
}

TEST(DiagStream, MultiSimFramesWithoutTheirHeaderAreMalformed) {
    const Bytes cell = logPacket(kCellId, kY2000Stamp, cellIdPayload());
    const Bytes shortHeader = {0x98, 0x01, 0x00, 0x00, 0x01, 0x00, 0x00, 0x00};
    Bytes badHeader = multiSim(1, cell);
    badHeader[1] = 0x02;
    const Bytes nested = multiSim(1, multiSim(1, cell));
    const Outcome r = runStream(framed({shortHeader, badHeader, nested}));
    EXPECT_EQ(r.stats.malformed, 3U);
    EXPECT_TRUE(r.packets.empty());
    EXPECT_TRUE(r.stats.logs.empty());
}

// Event ids no event row takes, so that each is counted as not decoded.
std::vector<std::uint16_t> undecodedEventIds(std::size_t n) {
    std::set<std::uint16_t> taken;
    for (const EventDecoderRow& row : eventDecoders()) taken.insert(row.id);
    std::vector<std::uint16_t> ids;
    for (std::uint16_t i = 0x0A5; ids.size() < n; ++i)
        if (!taken.contains(i)) ids.push_back(i);
    return ids;
}

TEST(DiagStream, EventReportsOfEveryPayloadFormAndBothTimeForms) {
    const auto ids = undecodedEventIds(8);
    // Payload bytes that would read as event words if a length were taken wrongly.
    const std::vector<WrittenEvent> events = {
        {ids[0], kY2000Stamp, {}, false},
        {ids[1], kY2000Stamp, {0xA6}, true},
        {ids[2], kY2000Stamp, {0xA7, 0x00}, false},
        {ids[3], kY2000Stamp, {0xA5, 0x80, 0xA5, 0x00, 0x05}, true},
        {ids[4], kY2000Stamp, {}, true},
        {ids[5], kY2000Stamp, {0x01}, false},
        {ids[6], kY2000Stamp, {0x02, 0x03}, true},
        {ids[7], kY2000Stamp, Bytes(255, 0xE0), false},
    };
    const Bytes report = eventReport(events);
    const Outcome r = runStream(framed({report, multiSim(1, report)}));
    EXPECT_EQ(r.stats.malformed, 0U);
    ASSERT_EQ(r.stats.events.size(), ids.size());
    for (const std::uint16_t i : ids) {
        const auto it = r.stats.events.find(i);
        ASSERT_NE(it, r.stats.events.end()) << i;
        EXPECT_EQ(it->second.notDecoded, 2U) << i;
    }
    EXPECT_TRUE(r.responses.empty());
    EXPECT_TRUE(r.stats.otherCommands.empty());
}

TEST(DiagStream, EventReportsThatOverrunTheirLengthAreMalformed) {
    const auto ids = undecodedEventIds(2);
    const std::vector<WrittenEvent> two = {{ids[0], kY2000Stamp, {1}, false},
                                           {ids[1], kY2000Stamp, {1, 2, 3}, false}};
    Bytes cut = eventReport(two);
    cut.pop_back();  // the second event's payload ends early
    cut[1] = static_cast<std::uint8_t>(cut[1] - 1);
    Bytes pastFrame = eventReport(two);
    pastFrame[1] = static_cast<std::uint8_t>(pastFrame[1] + 1);  // more than the frame holds
    const Outcome r = runStream(framed({cut, pastFrame}));
    EXPECT_EQ(r.stats.malformed, 2U);
    // The first event of the cut report stood whole and was counted.
    EXPECT_EQ(r.stats.events.size(), 1U);
    EXPECT_EQ(r.stats.events.at(ids[0]).notDecoded, 1U);
}

TEST(DiagStream, AFinalFrameCutShortIsCountedAtTheEnd) {
    const Bytes whole = framed({logPacket(kCellId, kY2000Stamp, cellIdPayload())});
    const Bytes stream = framed({logPacket(kCellId, kY2000Stamp, cellIdPayload()),
                                 logPacket(kCellId, kY2000Stamp, cellIdPayload())});
    const Bytes cut(stream.begin(), stream.end() - 5);
    const Outcome r = runStream(cut);
    EXPECT_EQ(r.packets.size(), 1U);
    EXPECT_EQ(r.stats.frames.frames, 1U);
    EXPECT_EQ(r.stats.frames.badFrames, 0U);
    EXPECT_EQ(r.stats.cutShort, cut.size() - whole.size());
}

TEST(DiagStream, ResetForgetsAFrameBegunAndKeepsTheCounts) {
    DiagStream diag;
    std::size_t packets = 0;
    const auto onEvents = [&](DecodedPacket&) { ++packets; };
    const Bytes wire = framed({logPacket(kCellId, kY2000Stamp, cellIdPayload())});
    diag.feed(wire, onEvents);
    diag.feed(std::span(wire).first(10), onEvents);
    diag.reset();
    diag.feed(wire, onEvents);
    diag.finish();
    EXPECT_EQ(packets, 2U);
    EXPECT_EQ(diag.stats().frames.badFrames, 0U);
    EXPECT_EQ(diag.stats().cutShort, 0U);
    EXPECT_EQ(logsOf(diag.stats(), kCellId, 0).decoded, 2U);
}

TEST(DiagStream, AMovedStreamKeepsCounting) {
    const Bytes wire = framed({logPacket(kNoRow, kY2000Stamp, Bytes{1})});
    DiagStream first;
    first.feed(wire, {});
    DiagStream moved(std::move(first));
    moved.feed(wire, {});
    DiagStream assigned;
    assigned.feed(framed({logPacket(kNoRow, kY2000Stamp, Bytes{2})}), {});
    assigned = std::move(moved);
    assigned.feed(wire, {});
    EXPECT_EQ(assigned.stats().logs.size(), 1U);
    EXPECT_EQ(logsOf(assigned.stats(), kNoRow, 1).notDecoded, 3U);
    EXPECT_EQ(assigned.stats().frames.frames, 3U);
}

TEST(DiagStream, PiecesOfEverySizeGiveTheSameEvents) {
    const auto ids = undecodedEventIds(1);
    const Bytes stream = [&] {
        Bytes s = {0x42, 0x7E};
        appendFrame(logPacket(kCellId, kY2000Stamp, cellIdPayload(0x7E)), s);
        appendFrame(multiSim(1, logPacket(kCellId, kY2000Stamp, cellIdPayload(0x7D))), s);
        appendFrame(eventReport(std::vector<WrittenEvent>{{ids[0], kY2000Stamp, {0x7E}, true}}), s);
        appendFrame(Bytes{0x7C, 0x7D, 0x7E}, s);
        s.push_back(0x10);
        return s;
    }();
    const Outcome whole = runStream(stream);
    ASSERT_EQ(whole.packets.size(), 2U);
    for (std::size_t piece = 1; piece <= stream.size(); ++piece) {
        const Outcome pieces = runStream(stream, {}, piece);
        ASSERT_EQ(pieces.packets.size(), whole.packets.size()) << piece;
        for (std::size_t i = 0; i < whole.packets.size(); ++i)
            EXPECT_EQ(pieces.packets[i].events[0].payload, whole.packets[i].events[0].payload);
        EXPECT_EQ(pieces.responses, whole.responses) << piece;
        EXPECT_EQ(pieces.stats.logs.size(), whole.stats.logs.size()) << piece;
        EXPECT_EQ(pieces.stats.events.size(), 1U) << piece;
        EXPECT_EQ(pieces.stats.frames.badFrames, 1U) << piece;
        EXPECT_EQ(pieces.stats.cutShort, 1U) << piece;
    }
}

TEST(DiagStream, DecodedLogCodesAreEveryTablesCodesOnceSorted) {
    std::set<std::uint16_t> codes;
    for (const auto table : logDecoderTables())
        for (const LogDecoderRow& row : table) codes.insert(row.code);
    const auto got = DiagStream::decodedLogCodes();
    EXPECT_EQ(std::vector<std::uint16_t>(got.begin(), got.end()),
              std::vector<std::uint16_t>(codes.begin(), codes.end()));
    EXPECT_TRUE(std::find(got.begin(), got.end(), kCellId) != got.end());
}

TEST(PacketWriters, RefuseWhatTheirLengthsCannotHold) {
    EXPECT_THROW((void)logPacket(kCellId, 0, Bytes(65524)), std::length_error);
    EXPECT_NO_THROW((void)logPacket(kCellId, 0, Bytes(65523)));
    EXPECT_THROW((void)eventReport(std::vector<WrittenEvent>{{1, 0, Bytes(256), false}}),
                 std::length_error);
    EXPECT_THROW((void)eventReport(std::vector<WrittenEvent>{{0x1000, 0, {}, false}}),
                 std::out_of_range);
}

TEST(PacketWriters, WriteTheLayoutsTheModemWrites) {
    EXPECT_EQ(logPacket(0xB0C0, 0x0102030405060708ULL, Bytes{0xAA}),
              (Bytes{0x10, 0x00, 0x0D, 0x00, 0x0D, 0x00, 0xC0, 0xB0, 0x08, 0x07, 0x06, 0x05, 0x04,
                     0x03, 0x02, 0x01, 0xAA}));
    // Event 442 with a 3-byte payload, as a modem reports it.
    EXPECT_EQ(eventReport(std::vector<WrittenEvent>{{442, 0x1122334455667788ULL, {0, 1, 0}}}),
              (Bytes{0x60, 0x0E, 0x00, 0xBA, 0x61, 0x88, 0x77, 0x66, 0x55, 0x44, 0x33, 0x22, 0x11,
                     0x03, 0x00, 0x01, 0x00}));
    // The truncated time: bits 16-31 of the timestamp.
    EXPECT_EQ(eventReport(std::vector<WrittenEvent>{{0x123, 0x00000000ABCD0000ULL, {5}, true}}),
              (Bytes{0x60, 0x05, 0x00, 0x23, 0xA1, 0xCD, 0xAB, 0x05}));
    EXPECT_EQ(multiSim(2, Bytes{0x10}),
              (Bytes{0x98, 0x01, 0x00, 0x00, 0x02, 0x00, 0x00, 0x00, 0x10}));
}

}  // namespace
}  // namespace pyx::diag::test
