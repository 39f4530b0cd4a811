// The LTE RRC state decoders: the peers' 0xB0C0 vectors (the channel and message the peer
// names, and the state we derive from them), event 1606 built by hand for each state, packets
// and events of the captures checked by hand, and the state through the store to the "LTE RRC
// State" screen.
#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <filesystem>
#include <iomanip>
#include <optional>
#include <sstream>

#include "messages/Messages.h"
#include "metrics/MetricValidator.h"
#include "sources/diag/decode/ByteReader.h"
#include "tests/sources/diag/support/DiagVectors.h"
#include "tests/sources/diag/umts/DecoderHarness.h"
#include "tests/sources/modem/ScreenText.h"

namespace pyx::diag::test {
namespace {

namespace id = decode::id;

constexpr std::uint16_t kOta = 0xB0C0;
constexpr std::uint16_t kStateChange = 1606;

std::string hexOf(std::span<const std::uint8_t> bytes) {
    std::ostringstream out;
    for (const std::uint8_t b : bytes) out << std::hex << std::setw(2) << std::setfill('0') << +b;
    return out.str();
}

// A vector's log payload: its bytes, or those after the 16-byte log header of a whole packet.
Bytes payloadOf(const Vector& v) {
    if (v.scope == "log_packet") return Bytes(v.bytes.begin() + 16, v.bytes.end());
    return v.bytes;
}

// The state of the one RRC state event among events, by its name ("" when none was written).
std::string stateWritten(const std::vector<MetricOut>& events) {
    if (countOf(events, id::K_LTE_RRC_STATE) == 0) return "";
    return text(eventOf(events, id::K_LTE_RRC_STATE), "state");
}

// ---- The peers' vectors ----

// Each 0xB0C0 vector the table takes: the channel the peer names (SCAT's GSMTAP sub-type;
// Rayhunter's v127 gives only pdu_num 5, PCCH in version 20), the message its PDU's first bits
// choose (TS 36.331), and the state we derive ("" for none: system information and paging come
// in every state).
struct OtaVector {
    const char* id;
    const char* channel;
    const char* message;
    const char* state;
};
constexpr OtaVector kOtaVectors[] = {
    {"v034", "DL_DCCH", "4c: c1 9, UEInformationRequest-r9", "KLTE_RRC_STATE_CONNECTED"},
    {"v035", "UL_DCCH", "10: c1 2, RRCConnectionReconfigurationComplete",
     "KLTE_RRC_STATE_CONNECTED"},
    {"v116", "UL_DCCH", "as v035", "KLTE_RRC_STATE_CONNECTED"},
    {"v117", "UL_DCCH", "as v035", "KLTE_RRC_STATE_CONNECTED"},
    {"v036", "PCCH", "Paging", ""},
    {"v118", "PCCH", "as v036", ""},
    {"v037", "UL_DCCH", "08: c1 1, MeasurementReport", "KLTE_RRC_STATE_CONNECTED"},
    {"v119", "UL_DCCH", "as v037", "KLTE_RRC_STATE_CONNECTED"},
    {"v039", "PCCH", "Paging", ""},
    {"v121", "PCCH", "as v039", ""},
    {"v040", "UL_DCCH", "08: c1 1, MeasurementReport", "KLTE_RRC_STATE_CONNECTED"},
    {"v122", "UL_DCCH", "as v040", "KLTE_RRC_STATE_CONNECTED"},
    {"v041", "UL_DCCH", "2c: c1 5, SecurityModeComplete", "KLTE_RRC_STATE_CONNECTED"},
    {"v123", "UL_DCCH", "as v041", "KLTE_RRC_STATE_CONNECTED"},
    {"v042", "PCCH", "Paging", ""},
    {"v124", "PCCH", "as v042", ""},
    {"v043", "DL_DCCH", "2e: c1 5, RRCConnectionRelease", "KLTE_RRC_STATE_IDLE"},
    {"v125", "DL_DCCH", "as v043", "KLTE_RRC_STATE_IDLE"},
    {"v044", "BCCH_DL_SCH", "SystemInformation", ""},
    {"v126", "BCCH_DL_SCH", "as v044", ""},
    {"v127", "PCCH", "Paging", ""},
};

// The RRC and Tx-power vectors no row of ours takes, and why. No peer has a Tx-power vector
// (0xB139, 0xB13C, 0xB16E, 0xB16F: VECTORS.md), so every one here is an RRC OTA packet.
struct Unused {
    const char* id;
    const char* why;
};
constexpr Unused kUnusedVectors[] = {
    {"v038",
     "0xB0C0 v19 pdu_num 50, NB-IoT UL-CCCH: not in the LTE channel table; refused "
     "(an NB-IoT RRC state is not the LTE RRC state the screen shows)"},
    {"v120", "the same packet as v038 (Rayhunter's copy): refused"},
};

// The channel our table reads a vector's (version, pdu_num) as, told by the states two
// one-byte PDUs give on it: 0x28 (c1 1 on DL-CCCH, 0 on UL-CCCH, 5 on the DCCHs) and 0x40
// (c1 2 on DL-CCCH, 1 on UL-CCCH, 8 on the DCCHs). DL-CCCH: reestablishment reject and
// reject, idle both; UL-CCCH: the two requests, attempting both; DL-DCCH: release (idle) and
// counter check (connected); UL-DCCH: connected both; the other channels tell nothing.
std::string channelRead(const Vector& v) {
    const Bytes payload = payloadOf(v);
    const std::size_t pduLength = v.expect["pdu_hex"].get<std::string>().size() / 2;
    const std::size_t pdu = payload.size() - pduLength;
    const std::size_t length = payload[0] >= 30 ? pdu - 5 : pdu - 2;
    std::string states;
    for (const std::uint8_t first : {0x28, 0x40}) {
        Bytes one(payload.begin(), payload.begin() + static_cast<std::ptrdiff_t>(pdu));
        one[length] = 1;
        one[length + 1] = 0;
        one.push_back(first);
        DecodeState state;
        const Decoded d = decode(lteRrcDecoders(), kOta, one, state);
        if (!d.decoded) return "refused";
        states += stateWritten(d.events) + ";";
    }
    if (states == "KLTE_RRC_STATE_IDLE;KLTE_RRC_STATE_IDLE;") return "DL_CCCH";
    if (states == "KLTE_RRC_STATE_ATMPT_CONNECTION;KLTE_RRC_STATE_ATMPT_CONNECTION;")
        return "UL_CCCH";
    if (states == "KLTE_RRC_STATE_IDLE;KLTE_RRC_STATE_CONNECTED;") return "DL_DCCH";
    if (states == "KLTE_RRC_STATE_CONNECTED;KLTE_RRC_STATE_CONNECTED;") return "UL_DCCH";
    if (states == ";;") return "BCCH, PCCH or MCCH";
    return states;
}

TEST(LteRrcVectors, EachOtaVectorGivesTheStateOfTheChannelAndMessageThePeerNames) {
    PYX_NEED_SHARED_DIAG();
    for (const OtaVector& expected : kOtaVectors) {
        const Vector& v = vector(expected.id);
        if (v.expect.contains("channel")) {
            EXPECT_EQ(v.expect["channel"].get<std::string>(), expected.channel) << expected.id;
        }
        const std::string channel = channelRead(v);
        const std::string peer = expected.channel;
        const bool stateless = peer == "PCCH" || peer == "BCCH_DL_SCH";
        EXPECT_EQ(channel, stateless ? "BCCH, PCCH or MCCH" : peer) << expected.id;

        DecodeState state;
        const Decoded d = decode(lteRrcDecoders(), kOta, payloadOf(v), state);
        ASSERT_TRUE(d.decoded) << expected.id;
        EXPECT_EQ(stateWritten(d.events), expected.state)
            << expected.id << ": " << expected.channel << " " << expected.message;
        if (!d.events.empty()) {
            const Dict written = eventOf(d.events, id::K_LTE_RRC_STATE);
            EXPECT_EQ(text(written, "timestamp"), std::to_string(kTimeMs));
            // The first state seen: a state before it only where the message implies one
            // (a release ends a connection).
            const bool release = std::string(expected.state) == "KLTE_RRC_STATE_IDLE";
            EXPECT_EQ(text(written, "prev_state"), release ? "KLTE_RRC_STATE_CONNECTED" : "");
            EXPECT_FALSE(written.contains("prev_state_dur_ms"));
            EXPECT_FALSE(written.contains("cause"));
        }
    }
}

TEST(LteRrcVectors, EveryRrcOrTxPowerVectorIsUsedOrSaysWhyNot) {
    PYX_NEED_SHARED_DIAG();
    for (const Unused& unused : kUnusedVectors) {
        const Vector& v = vector(unused.id);
        DecodeState state;
        EXPECT_FALSE(decode(lteRrcDecoders(), kOta, payloadOf(v), state).decoded)
            << unused.id << ": " << unused.why;
    }
    for (const Vector& v : vectors()) {
        const bool ours = v.logCode == "0xB0C0" || v.logCode == "0xB139" || v.logCode == "0xB13C" ||
                          v.logCode == "0xB16E" || v.logCode == "0xB16F";
        if (!ours) continue;
        const bool listed = std::any_of(std::begin(kUnusedVectors), std::end(kUnusedVectors),
                                        [&](const Unused& u) { return v.id == u.id; });
        const bool used = std::any_of(std::begin(kOtaVectors), std::end(kOtaVectors),
                                      [&](const OtaVector& o) { return v.id == o.id; });
        EXPECT_TRUE(listed != used) << v.id << " " << v.logCode;
    }
}

TEST(LteRrcDecoders, EveryPrefixOfAPacketIsRefusedAndLeavesTheStateAlone) {
    PYX_NEED_SHARED_DIAG();
    std::vector<Bytes> packets;
    for (const OtaVector& o : kOtaVectors) packets.push_back(payloadOf(vector(o.id)));
    const auto attach = capturePayloads("mi-attach_sample.mi2log", kOta);
    ASSERT_GT(attach.size(), 329U);
    for (const std::size_t i : {20U, 21U, 22U, 329U}) packets.push_back(attach[i]);
    for (const Bytes& whole : packets) {
        for (std::size_t n = 0; n < whole.size(); ++n) {
            const Bytes prefix(whole.begin(), whole.begin() + static_cast<std::ptrdiff_t>(n));
            DecodeState state;
            state.lte.rrc.state = KLTE_RRC_STATE_ENDING;
            const Decoded d = decode(lteRrcDecoders(), kOta, prefix, state);
            EXPECT_FALSE(d.decoded) << hexOf(whole) << " cut to " << n;
            EXPECT_EQ(state.lte.rrc.state, KLTE_RRC_STATE_ENDING);
        }
        // One byte too many is refused too: the header's length no longer fits.
        Bytes longer = whole;
        longer.push_back(0);
        DecodeState state;
        EXPECT_FALSE(decode(lteRrcDecoders(), kOta, longer, state).decoded) << hexOf(whole);
    }
}

// ---- The OTA header of every version group, built by hand ----

// A packet of version with the channel's pdu_num and a one-byte PDU, laid out as the header
// of its group (PROTOCOL.md 6.4).
Bytes otaPacket(std::uint8_t version, std::uint8_t pduNum, std::uint8_t pdu,
                std::uint8_t segment = 0) {
    struct Header {
        std::size_t pduNumAt, lengthAt, pduAt;
    };
    Header h{12, 17, 19};
    if (version <= 4) {
        h = {10, 11, 13};
    } else if (version <= 7) {
        h = {10, 15, 17};
    } else if (version >= 25 && version <= 29) {
        h = {14, 19, 21};
    } else if (version >= 30) {
        h = {14, 19, 24};
    }
    const auto [pduNumAt, lengthAt, pduAt] = h;
    Bytes p(pduAt + 1, 0);
    p[0] = version;
    p[pduNumAt] = pduNum;
    p[lengthAt] = 1;
    if (version >= 30) p[pduAt - 1] = segment;
    p[pduAt] = pdu;
    return p;
}

std::string stateOf(const Bytes& packet) {
    DecodeState state;
    const Decoded d = decode(lteRrcDecoders(), kOta, packet, state);
    return d.decoded ? stateWritten(d.events) : "refused";
}

TEST(LteRrcDecoders, EachVersionGroupsHeaderAndChannelTableIsRead) {
    // DL-DCCH RRCConnectionRelease (0x28) and UL-CCCH RRCConnectionRequest (0x40) in one
    // version of each table column: 2 (PDU at 13), 6 (17), 12 (19, pdu_num from 8),
    // 16 (19, no pdu_num 3), 27 (21), 31 (24 with the segment id).
    struct Case {
        std::uint8_t version, dlDcch, ulCcch;
    };
    for (const Case c : {Case{2, 6, 7}, Case{6, 6, 7}, Case{12, 13, 14}, Case{16, 7, 8},
                         Case{27, 9, 10}, Case{31, 9, 10}}) {
        EXPECT_EQ(stateOf(otaPacket(c.version, c.dlDcch, 0x28)), "KLTE_RRC_STATE_IDLE")
            << +c.version;
        EXPECT_EQ(stateOf(otaPacket(c.version, c.ulCcch, 0x40)), "KLTE_RRC_STATE_ATMPT_CONNECTION")
            << +c.version;
    }
    // Versions outside the table are refused, whatever their header group: 5 (header of
    // 5-7), 10, 11, 17, 18, 21, 23 (8-24), 28 (25-29), 32 (30-).
    for (const std::uint8_t version : {0, 1, 5, 10, 11, 17, 18, 21, 23, 28, 32, 255}) {
        EXPECT_EQ(rowFor(lteRrcDecoders(), kOta, otaPacket(version, 6, 0x28)), nullptr) << +version;
        EXPECT_EQ(stateOf(otaPacket(version, 6, 0x28)), "refused") << +version;
    }
    // pdu_num outside its version's table: NB-IoT channels (v19: 45-52, v20: 54-61), gaps.
    EXPECT_EQ(stateOf(otaPacket(19, 50, 0x40)), "refused");
    EXPECT_EQ(stateOf(otaPacket(20, 59, 0x40)), "refused");
    EXPECT_EQ(stateOf(otaPacket(15, 3, 0x40)), "refused");  // v15 has no pdu_num 3
    EXPECT_EQ(stateOf(otaPacket(26, 2, 0x40)), "refused");  // nor v26 2
    EXPECT_EQ(stateOf(otaPacket(8, 0, 0x40)), "refused");
    EXPECT_EQ(stateOf(otaPacket(9, 7, 0x40)), "refused");  // v9 starts at 8
}

TEST(LteRrcDecoders, OnlyTheLeadingSegmentOfASegmentedMessageIsRead) {
    // Version 30, DL-DCCH (pdu_num 9) release: whole (0) and leading (1) segments say idle;
    // the continuing ones (2-6, 7 the last) start mid-message and tell nothing; 8 and more
    // are no segment ids.
    EXPECT_EQ(stateOf(otaPacket(30, 9, 0x28, 0)), "KLTE_RRC_STATE_IDLE");
    EXPECT_EQ(stateOf(otaPacket(30, 9, 0x28, 1)), "KLTE_RRC_STATE_IDLE");
    for (const std::uint8_t segment : {2, 3, 6, 7}) {
        DecodeState state;
        const Decoded d = decode(lteRrcDecoders(), kOta, otaPacket(30, 9, 0x28, segment), state);
        EXPECT_TRUE(d.decoded) << +segment;
        EXPECT_TRUE(d.events.empty()) << +segment;
    }
    EXPECT_EQ(stateOf(otaPacket(30, 9, 0x28, 8)), "refused");
    EXPECT_EQ(stateOf(otaPacket(30, 9, 0x28, 255)), "refused");
}

TEST(LteRrcDecoders, EachMessageOfTheCcchsAndDcchsTellsItsState) {
    // Version 8: DL-CCCH 5, DL-DCCH 6, UL-CCCH 7, UL-DCCH 8, PCCH 4.
    const auto after = [](std::int32_t before, std::uint8_t pduNum, std::uint8_t pdu) {
        DecodeState state;
        state.lte.rrc.state = before;
        const Decoded d = decode(lteRrcDecoders(), kOta, otaPacket(8, pduNum, pdu), state);
        return d.decoded ? stateWritten(d.events) : "refused";
    };
    const std::int32_t idle = KLTE_RRC_STATE_IDLE, connected = KLTE_RRC_STATE_CONNECTED;
    // DL-CCCH c1 in b1-2: reestablishment, reestablishment reject, reject, setup.
    EXPECT_EQ(after(connected, 5, 0x00), "KLTE_RRC_STATE_ATMPT_CONNECTION");
    EXPECT_EQ(after(connected, 5, 0x20), "KLTE_RRC_STATE_IDLE");
    EXPECT_EQ(after(connected, 5, 0x40), "KLTE_RRC_STATE_IDLE");
    EXPECT_EQ(after(idle, 5, 0x60), "KLTE_RRC_STATE_ATMPT_CONNECTION");
    EXPECT_EQ(after(idle, 5, 0x80), "refused");  // messageClassExtension
    // UL-CCCH c1 in b1: reestablishment request, request.
    EXPECT_EQ(after(connected, 7, 0x00), "KLTE_RRC_STATE_ATMPT_CONNECTION");
    EXPECT_EQ(after(idle, 7, 0x40), "KLTE_RRC_STATE_ATMPT_CONNECTION");
    EXPECT_EQ(after(idle, 7, 0x80), "refused");
    // DL-DCCH: the release says idle; every other message, the extension too, connected.
    EXPECT_EQ(after(connected, 6, 0x28), "KLTE_RRC_STATE_IDLE");
    for (std::uint8_t c1 = 0; c1 < 16; ++c1) {
        if (c1 == 5) continue;
        EXPECT_EQ(after(idle, 6, static_cast<std::uint8_t>(c1 << 3)), "KLTE_RRC_STATE_CONNECTED")
            << +c1;
    }
    EXPECT_EQ(after(idle, 6, 0xA8), "KLTE_RRC_STATE_CONNECTED");
    // UL-DCCH: connected, whatever the message.
    for (std::uint8_t c1 = 0; c1 < 16; ++c1)
        EXPECT_EQ(after(idle, 8, static_cast<std::uint8_t>(c1 << 3)), "KLTE_RRC_STATE_CONNECTED")
            << +c1;
    // PCCH: nothing, in any state.
    EXPECT_EQ(after(idle, 4, 0x40), "");
    EXPECT_EQ(after(connected, 4, 0x40), "");
    // A state already written is not written again.
    EXPECT_EQ(after(connected, 8, 0x08), "");
    EXPECT_EQ(after(idle, 6, 0x28), "");
}

// ---- Transitions and their durations ----

TEST(LteRrcDecoders, AChangeComesWithThePreviousStateAndHowLongItLastedWhenBothEndsWereSeen) {
    DecodeState state;
    const std::uint64_t t0 = kTimeMs;
    // Connected when the capture begins: a measurement report says so, not since when.
    Decoded d = decode(lteRrcDecoders(), kOta, otaPacket(8, 8, 0x08), state, t0);
    Dict written = eventOf(d.events, id::K_LTE_RRC_STATE);
    EXPECT_EQ(text(written, "state"), "KLTE_RRC_STATE_CONNECTED");
    EXPECT_FALSE(written.contains("prev_state"));
    // Released 3 s later: the connected state's start was not seen, so no duration.
    d = decode(lteRrcDecoders(), kOta, otaPacket(8, 6, 0x28), state, t0 + 3000);
    written = eventOf(d.events, id::K_LTE_RRC_STATE);
    EXPECT_EQ(text(written, "state"), "KLTE_RRC_STATE_IDLE");
    EXPECT_EQ(text(written, "prev_state"), "KLTE_RRC_STATE_CONNECTED");
    EXPECT_FALSE(written.contains("prev_state_dur_ms"));
    // A request 12.5 s after the release: idle lasted 12 500 ms.
    d = decode(lteRrcDecoders(), kOta, otaPacket(8, 7, 0x40), state, t0 + 15'500);
    written = eventOf(d.events, id::K_LTE_RRC_STATE);
    EXPECT_EQ(text(written, "state"), "KLTE_RRC_STATE_ATMPT_CONNECTION");
    EXPECT_EQ(text(written, "prev_state"), "KLTE_RRC_STATE_IDLE");
    EXPECT_EQ(text(written, "prev_state_dur_ms"), "12500");
    // The setup does not change the state; the setup complete 80 ms after the request does.
    EXPECT_TRUE(
        decode(lteRrcDecoders(), kOta, otaPacket(8, 5, 0x60), state, t0 + 15'540).events.empty());
    d = decode(lteRrcDecoders(), kOta, otaPacket(8, 8, 0x20), state, t0 + 15'580);
    written = eventOf(d.events, id::K_LTE_RRC_STATE);
    EXPECT_EQ(text(written, "state"), "KLTE_RRC_STATE_CONNECTED");
    EXPECT_EQ(text(written, "prev_state_dur_ms"), "80");
    // A missed release (attach_sample has such requests): a request is sent from idle only,
    // so the state before is idle, for a time unknown.
    d = decode(lteRrcDecoders(), kOta, otaPacket(8, 7, 0x40), state, t0 + 60'000);
    written = eventOf(d.events, id::K_LTE_RRC_STATE);
    EXPECT_EQ(text(written, "state"), "KLTE_RRC_STATE_ATMPT_CONNECTION");
    EXPECT_EQ(text(written, "prev_state"), "KLTE_RRC_STATE_IDLE");
    EXPECT_FALSE(written.contains("prev_state_dur_ms"));
    // A re-establishment request is sent from a connection: the connection lasted from its
    // setup complete until then.
    d = decode(lteRrcDecoders(), kOta, otaPacket(8, 8, 0x20), state, t0 + 60'100);
    d = decode(lteRrcDecoders(), kOta, otaPacket(8, 7, 0x00), state, t0 + 70'100);
    written = eventOf(d.events, id::K_LTE_RRC_STATE);
    EXPECT_EQ(text(written, "prev_state"), "KLTE_RRC_STATE_CONNECTED");
    EXPECT_EQ(text(written, "prev_state_dur_ms"), "10000");
    // A setup seen without its request: attempting since a time unknown, so the complete
    // comes without a duration.
    DecodeState fresh;
    fresh.lte.rrc.state = KLTE_RRC_STATE_IDLE;
    fresh.lte.rrc.sinceMs = t0;
    d = decode(lteRrcDecoders(), kOta, otaPacket(8, 5, 0x60), fresh, t0 + 1000);
    written = eventOf(d.events, id::K_LTE_RRC_STATE);
    EXPECT_EQ(text(written, "prev_state_dur_ms"), "");  // the idle state's end is not seen
    d = decode(lteRrcDecoders(), kOta, otaPacket(8, 8, 0x20), fresh, t0 + 1040);
    EXPECT_FALSE(eventOf(d.events, id::K_LTE_RRC_STATE).contains("prev_state_dur_ms"));
}

// ---- Event 1606 ----

TEST(LteRrcEvents, EachStateOfTheEventIsOurs) {
    struct Case {
        std::uint8_t argument;
        const char* state;
    };
    for (const Case c : {Case{1, "KLTE_RRC_STATE_NULL"}, Case{2, "KLTE_RRC_STATE_IDLE"},
                         Case{3, "KLTE_RRC_STATE_ATMPT_CONNECTION"},
                         Case{4, "KLTE_RRC_STATE_CONNECTED"}, Case{7, "KLTE_RRC_STATE_ENDING"}}) {
        DecodeState state;
        const Bytes argument{c.argument};
        const Decoded d = decodeEvent(eventDecoders(), kStateChange, argument, state);
        ASSERT_TRUE(d.decoded) << +c.argument;
        const Dict written = eventOf(d.events, id::K_LTE_RRC_STATE);
        EXPECT_EQ(text(written, "state"), c.state) << +c.argument;
        EXPECT_EQ(text(written, "timestamp"), std::to_string(kTimeMs));
        EXPECT_TRUE(state.lte.rrc.fromEvents);
    }
}

TEST(LteRrcEvents, OtherArgumentsAndOtherEventsAreRefused) {
    DecodeState state;
    for (const std::uint8_t argument : {0, 5, 6, 8, 9, 255}) {
        const Bytes one{argument};
        EXPECT_FALSE(decodeEvent(eventDecoders(), kStateChange, one, state).decoded) << +argument;
    }
    for (const Bytes& length : {Bytes{}, Bytes{4, 0}, Bytes{4, 4, 4}})
        EXPECT_FALSE(decodeEvent(eventDecoders(), kStateChange, length, state).decoded)
            << length.size();
    EXPECT_FALSE(state.lte.rrc.state);
    EXPECT_FALSE(state.lte.rrc.fromEvents);
    // The other LTE RRC events (timers 1605, DL/UL messages 1609/1610, paging cycle 1614)
    // have no row.
    for (const std::uint16_t other : {1605, 1609, 1610, 1614, 1994})
        EXPECT_EQ(eventRowFor(eventDecoders(), other), nullptr) << other;
}

TEST(LteRrcEvents, TransitionsCarryThePreviousStateAndItsDuration) {
    DecodeState state;
    const auto at = [&](std::uint8_t argument, std::uint64_t offsetMs) {
        const Bytes one{argument};
        return decodeEvent(eventDecoders(), kStateChange, one, state, kTimeMs + offsetMs);
    };
    Decoded d = at(2, 0);
    EXPECT_FALSE(eventOf(d.events, id::K_LTE_RRC_STATE).contains("prev_state"));
    d = at(3, 5000);
    Dict written = eventOf(d.events, id::K_LTE_RRC_STATE);
    EXPECT_EQ(text(written, "prev_state"), "KLTE_RRC_STATE_IDLE");
    EXPECT_EQ(text(written, "prev_state_dur_ms"), "5000");
    d = at(4, 5150);
    EXPECT_EQ(text(eventOf(d.events, id::K_LTE_RRC_STATE), "prev_state_dur_ms"), "150");
    d = at(4, 5200);  // the same state again: nothing written
    EXPECT_TRUE(d.decoded);
    EXPECT_TRUE(d.events.empty());
    d = at(7, 20'000);
    written = eventOf(d.events, id::K_LTE_RRC_STATE);
    EXPECT_EQ(text(written, "state"), "KLTE_RRC_STATE_ENDING");
    EXPECT_EQ(text(written, "prev_state"), "KLTE_RRC_STATE_CONNECTED");
    EXPECT_EQ(text(written, "prev_state_dur_ms"), "14850");
    d = at(2, 20'040);
    EXPECT_EQ(text(eventOf(d.events, id::K_LTE_RRC_STATE), "prev_state_dur_ms"), "40");
    // A clock that goes back gives no duration.
    d = at(1, 10'000);
    written = eventOf(d.events, id::K_LTE_RRC_STATE);
    EXPECT_EQ(text(written, "state"), "KLTE_RRC_STATE_NULL");
    EXPECT_FALSE(written.contains("prev_state_dur_ms"));
}

TEST(LteRrcEvents, OnceTheModemSendsEventsTheOtaMessagesNoLongerWriteTheState) {
    DecodeState state;
    // Before any event, the OTA packets write the state.
    EXPECT_EQ(stateWritten(decode(lteRrcDecoders(), kOta, otaPacket(8, 7, 0x40), state).events),
              "KLTE_RRC_STATE_ATMPT_CONNECTION");
    const Bytes connected{4};
    EXPECT_EQ(stateWritten(decodeEvent(eventDecoders(), kStateChange, connected, state).events),
              "KLTE_RRC_STATE_CONNECTED");
    // Afterwards the release is still decoded (its packet is understood) but the modem's
    // CLOSING and IDLE_CAMPED events say when the state changes.
    const Decoded release = decode(lteRrcDecoders(), kOta, otaPacket(8, 6, 0x28), state);
    EXPECT_TRUE(release.decoded);
    EXPECT_TRUE(release.events.empty());
    EXPECT_EQ(state.lte.rrc.state, KLTE_RRC_STATE_CONNECTED);
}

// ---- The captures ----

// The index-th 0xB0C0 payload of a capture, checked to be the bytes read by hand.
Bytes capturedOta(const std::string& file, std::size_t index, const std::string& hex) {
    const auto payloads = capturePayloads(file, kOta);
    if (index >= payloads.size()) {
        ADD_FAILURE() << file << " has " << payloads.size() << " OTA packets";
        return {};
    }
    EXPECT_EQ(hexOf(payloads[index]), hex) << file << " packet " << index;
    return payloads[index];
}

// attach_sample (version 15: DL-CCCH 6, DL-DCCH 7, UL-CCCH 8, UL-DCCH 9; PDU at 19):
//  20: UL-CCCH 57..: c1 1 RRCConnectionRequest, a random value as identity (b3 = 1) and
//      cause mo-Signalling (b44-46 = 3), as an attach's request is;
//  21: DL-CCCH 60..: c1 3 RRCConnectionSetup;
//  22: UL-DCCH 20..: c1 4 RRCConnectionSetupComplete, carrying the attach request
//      (07 41 ... in its dedicatedInfoNAS);
//  329: DL-DCCH 28..: c1 5 RRCConnectionRelease.
TEST(LteRrcCaptures, AnAttachsConnectionAndItsRelease) {
    PYX_NEED_SHARED_DIAG();
    const std::string file = "mi-attach_sample.mi2log";
    const Bytes request =
        capturedOta(file, 20, "0f0d2100c0006e140000000008000000000600577073b0f986");
    const Bytes setup = capturedOta(file, 21,
                                    "0f0d2100c0006e140000b30f060000000018006012980f5dd204ba007caa"
                                    "8b7535c3824258a116bf42303c");
    const Bytes release = capturedOta(file, 329,
                                      "0f0d210138016e140000c60707000000001800281a83451b984975083"
                                      "4e08663fffc050087022a10183800");
    const auto complete = capturePayloads(file, kOta).at(22);
    EXPECT_EQ(hexOf(complete).substr(0, 52),
              "0f0d2101c0006e1400000000090000000090002030fae6e98087");
    EXPECT_NE(hexOf(complete).find("0741020bf6"), std::string::npos);  // attach request

    DecodeState state;
    state.lte.rrc.state = KLTE_RRC_STATE_IDLE;
    EXPECT_EQ(stateWritten(decode(lteRrcDecoders(), kOta, request, state).events),
              "KLTE_RRC_STATE_ATMPT_CONNECTION");
    EXPECT_EQ(stateWritten(decode(lteRrcDecoders(), kOta, setup, state).events), "");
    EXPECT_EQ(stateWritten(decode(lteRrcDecoders(), kOta, complete, state).events),
              "KLTE_RRC_STATE_CONNECTED");
    EXPECT_EQ(stateWritten(decode(lteRrcDecoders(), kOta, release, state).events),
              "KLTE_RRC_STATE_IDLE");
}

// mobility_sample (version 8: DL-CCCH 5, UL-CCCH 7, UL-DCCH 8, DL-DCCH 6), a re-establishment:
//  383: UL-CCCH 06..: c1 0 RRCConnectionReestablishmentRequest (cause otherFailure,
//       b44-45 = 2);
//  384: DL-CCCH 00..: c1 0 RRCConnectionReestablishment;
//  385: UL-DCCH 18 c0: c1 3 RRCConnectionReestablishmentComplete;
//  1554: DL-DCCH 2e 02: the release of v043.
TEST(LteRrcCaptures, AReestablishmentIsAnAttemptUntilItCompletes) {
    PYX_NEED_SHARED_DIAG();
    const std::string file = "mi-mobility_sample.mi2log";
    const Bytes request =
        capturedOta(file, 383, "080a7200a501b71600000000070000000006000623b9c208d8");
    const Bytes reestablishment = capturedOta(
        file, 384,
        "080a7200a501b7160000360c05000000001400000297600f955172a6b670483e14228682108940");
    const Bytes complete = capturedOta(file, 385, "080a7201a501b716000000000800000000020018c0");
    const Bytes release = capturedOta(file, 1554, "080a7201b400ca0800007219060000000002002e02");
    DecodeState state;
    state.lte.rrc.state = KLTE_RRC_STATE_CONNECTED;
    EXPECT_EQ(stateWritten(decode(lteRrcDecoders(), kOta, request, state).events),
              "KLTE_RRC_STATE_ATMPT_CONNECTION");
    EXPECT_EQ(stateWritten(decode(lteRrcDecoders(), kOta, reestablishment, state).events), "");
    EXPECT_EQ(stateWritten(decode(lteRrcDecoders(), kOta, complete, state).events),
              "KLTE_RRC_STATE_CONNECTED");
    EXPECT_EQ(stateWritten(decode(lteRrcDecoders(), kOta, release, state).events),
              "KLTE_RRC_STATE_IDLE");
}

// The sequence of states each capture's OTA packets write, in stream order: every packet
// decodes (no capture has an NB-IoT channel, a CCCH extension or a version outside the table),
// and a state is written only when it changes.
TEST(LteRrcCaptures, EveryOtaPacketOfEveryCaptureDecodes) {
    PYX_NEED_SHARED_DIAG();
    std::map<std::string, std::pair<std::size_t, std::size_t>> counts;  // decoded, written
    for (const auto& entry : std::filesystem::directory_iterator(sharedDiag() / "captures")) {
        if (entry.path().extension() != ".mi2log") continue;
        const std::string file = entry.path().filename().string();
        DecodeState state;
        std::optional<std::string> last;
        for (const Bytes& payload : capturePayloads(file, kOta)) {
            const Decoded d = decode(lteRrcDecoders(), kOta, payload, state);
            EXPECT_TRUE(d.decoded) << file << " " << hexOf(payload);
            counts[file].first += d.decoded ? 1 : 0;
            if (d.events.empty()) continue;
            const std::string written = stateWritten(d.events);
            EXPECT_NE(last, written) << file;
            last = written;
            ++counts[file].second;
        }
    }
    using P = std::pair<std::size_t, std::size_t>;
    EXPECT_EQ(counts["mi-attach_sample.mi2log"].first, 3044U);
    EXPECT_EQ(counts["mi-mobility_sample.mi2log"].first, 6478U);
    EXPECT_EQ(counts["mi-unittest-sprint.mi2log"].first, 15380U);
    // Xiaomi Mi 10, version 26 inside multi-SIM wrappers: paging only (PCCH, pdu_num 7).
    EXPECT_EQ(counts["mi-20201116_170453_Xiaomi-Mi10_46000.mi2log"], (P{1756, 0}));
    // offline_log_example (version 9): a request, then its setup complete.
    EXPECT_EQ(counts["mi-offline_log_example.mi2log"], (P{17, 2}));
}

// offline_log_example has the event reports too: 1606 says IDLE_NOT_CAMPED, IDLE_CAMPED
// (twice), CONNECTING, then CONNECTED after the setup complete (event 1610 0x84 just before);
// its OTA packets alone give the last two.
TEST(LteRrcCaptures, TheEventsAndTheOtaPacketsOfOneCaptureAgree) {
    PYX_NEED_SHARED_DIAG();
    const std::string file = "mi-offline_log_example.mi2log";
    const std::array<std::uint16_t, 1> ids{kStateChange};
    const auto events = captureEvents(file, ids);
    std::vector<std::string> arguments;
    for (const CapturedEvent& e : events) arguments.push_back(hexOf(e.payload));
    EXPECT_EQ(arguments, (std::vector<std::string>{"01", "02", "02", "03", "04"}));

    std::vector<std::string> fromEvents;
    DecodeState state;
    for (const CapturedEvent& e : events) {
        const Decoded d = decodeEvent(eventDecoders(), e.id, e.payload, state);
        EXPECT_TRUE(d.decoded);
        if (!d.events.empty()) fromEvents.push_back(stateWritten(d.events));
    }
    EXPECT_EQ(fromEvents, (std::vector<std::string>{"KLTE_RRC_STATE_NULL", "KLTE_RRC_STATE_IDLE",
                                                    "KLTE_RRC_STATE_ATMPT_CONNECTION",
                                                    "KLTE_RRC_STATE_CONNECTED"}));

    std::vector<std::string> fromOta;
    DecodeState otaState;
    for (const Bytes& payload : capturePayloads(file, kOta)) {
        const Decoded d = decode(lteRrcDecoders(), kOta, payload, otaState);
        if (!d.events.empty()) fromOta.push_back(stateWritten(d.events));
    }
    EXPECT_EQ(fromOta, (std::vector<std::string>(fromEvents.end() - 2, fromEvents.end())));
}

// ---- The screen ----

TEST(LteRrcScreens, TheRrcStateScreenShowsTheStateThePreviousOneAndItsDuration) {
    const auto store = MetricValidator::create(nullptr);
    DecodeState state;
    const auto event = [&](std::uint8_t argument, std::uint64_t offsetMs) {
        const Bytes one{argument};
        const Decoded d =
            decodeEvent(eventDecoders(), kStateChange, one, state, kTimeMs + offsetMs);
        ASSERT_TRUE(d.decoded);
        feed(store, d.events);
    };
    const auto shown = [&](const std::string& key) {
        return pyx::test::shownOn(store, "LTE", "RRC State", key);
    };
    event(2, 0);
    EXPECT_EQ(shown("state"), "KLTE_RRC_STATE_IDLE");
    EXPECT_EQ(shown("prev_state"), std::nullopt);
    event(3, 8000);
    event(4, 8120);
    EXPECT_EQ(shown("state"), "KLTE_RRC_STATE_CONNECTED");
    EXPECT_EQ(shown("prev_state"), "KLTE_RRC_STATE_ATMPT_CONNECTION");
    EXPECT_EQ(shown("prev_state_dur_ms"), "120");
    EXPECT_EQ(shown("timestamp").value_or("").substr(0, 10), "2020-09-13");
    event(1, 9000);
    EXPECT_EQ(shown("state"), "KLTE_RRC_STATE_NULL");

    // The OTA path to the same screen: the release of v043 after a connection.
    const auto otaStore = MetricValidator::create(nullptr);
    DecodeState ota;
    feed(otaStore, decode(lteRrcDecoders(), kOta, otaPacket(8, 8, 0x20), ota).events);
    feed(otaStore, decode(lteRrcDecoders(), kOta, otaPacket(8, 6, 0x28), ota).events);
    EXPECT_EQ(pyx::test::shownOn(otaStore, "LTE", "RRC State", "state"), "KLTE_RRC_STATE_IDLE");
    EXPECT_EQ(pyx::test::shownOn(otaStore, "LTE", "RRC State", "prev_state"),
              "KLTE_RRC_STATE_CONNECTED");
    EXPECT_EQ(pyx::test::shownOn(otaStore, "LTE", "RRC State", "prev_state_dur_ms"), "0");
}

// ---- Noise ----

TEST(LteRrcDecoders, NoisePayloadsNeverReadPastTheirEndAndWhatIsWrittenDecodes) {
    EXPECT_GT(feedNoise(lteRrcDecoders()), 0U);
    // Short payloads with a real header, random beyond it, through every row: the noise
    // above seldom makes the length field fit.
    std::uint32_t seed = 12345;
    std::size_t taken = 0;
    DecodeState state;
    for (const LogDecoderRow& row : lteRrcDecoders()) {
        for (std::uint8_t pduNum = 0; pduNum < 16; ++pduNum) {
            for (std::uint8_t segment = 0; segment < 9; ++segment) {
                seed = seed * 1103515245U + 12345U;
                const auto first = static_cast<std::uint8_t>(seed >> 16);
                const Decoded d = decode(
                    lteRrcDecoders(), kOta,
                    otaPacket(static_cast<std::uint8_t>(row.version), pduNum, first, segment),
                    state);
                taken += d.decoded ? 1 : 0;
                for (const MetricOut& e : d.events) EXPECT_EQ(e.metricID, id::K_LTE_RRC_STATE);
            }
        }
    }
    EXPECT_GT(taken, 0U);
}

TEST(LteRrcEvents, NoisePayloadsNeverReadPastTheirEndAndWhatIsWrittenDecodes) {
    EXPECT_GT(feedEventNoise(eventDecoders()), 0U);
}

}  // namespace
}  // namespace pyx::diag::test
