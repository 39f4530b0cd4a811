// The LTE RRC state (K_LTE_RRC_STATE): from the modem's own event 1606 LTE_RRC_STATE_CHANGE,
// and, where event reports are off, from the LTE RRC OTA log packet (0xB0C0): its header names
// the logical channel, and the first bits of its PDU (UPER) the message; nothing more of the
// PDU is read.
#include <algorithm>
#include <array>
#include <cstdint>
#include <limits>
#include <optional>

#include "messages/Messages.h"
#include "sources/diag/DecodeState.h"
#include "sources/diag/LogDecoder.h"
#include "sources/diag/decode/ByteReader.h"

namespace pyx::diag {

namespace {

using decode::Reader;
namespace id = decode::id;

// A state a packet tells: whether the packet is the transition into it (so that its time is
// when the state began) or only shows that the state holds (it may have begun earlier), and
// the state the transition must have come from, where the message implies one (a connection
// request is sent from idle only; a release ends a connection).
struct Told {
    std::int32_t state;
    bool begins = false;
    std::optional<std::int32_t> from;
};

// Writes the state when it differs from the one last written, with the state before it and,
// when both ends of that one were seen, how long it lasted. When the message implies another
// state before than the one last written, a transition was missed (the captures have
// connection requests with no release logged since the last connection): the state before is
// the implied one, and how long it lasted is unknown.
//
// Only on a change, not on every OTA message: the "LTE RRC State" screen shows a transition
// (the state, the one before, how long that lasted), which a user reads as "what the modem is
// in now and since when". In connected mode OTA messages come several a second (measurement
// reports, reconfigurations), each saying "connected" again; writing each would restamp the
// screen without telling anything new and fill a recording with copies. The modem's own event
// is sent on changes only too, so both sources write the same records.
void tell(const Told& told, std::uint64_t timeMs, LteRrcState& rrc, std::vector<MetricOut>& out) {
    if (rrc.state == told.state) return;
    const bool missed = told.from && rrc.state != told.from;
    const std::optional<std::int32_t> before = missed ? told.from : rrc.state;
    KCellularLteRrcState m;
    m.setTimestamp(timeMs);
    m.setState(told.state);
    if (before) m.setPrevState(*before);
    if (!missed && before && told.begins && rrc.sinceMs && timeMs >= *rrc.sinceMs) {
        const std::uint64_t lasted = timeMs - *rrc.sinceMs;
        m.setPrevStateDurMs(static_cast<std::uint32_t>(
            std::min<std::uint64_t>(lasted, std::numeric_limits<std::uint32_t>::max())));
    }
    rrc.state = told.state;
    rrc.sinceMs = told.begins ? std::optional(timeMs) : std::nullopt;
    out.push_back({id::K_LTE_RRC_STATE, m.data()});
}

// ---- Event 1606 LTE_RRC_STATE_CHANGE ----

// Its one-byte argument, the modem's LTE RRC state (SCAT names 1, 2, 3, 4 and 7; other values
// are refused), as our enumeration has it:
//   1 IDLE_NOT_CAMPED -> NULL: camped on no LTE cell (searching, or LTE left for another
//                        technology); our IDLE is idle on a cell, as the simulated drive
//                        writes it beside the serving cell it camps on;
//   2 IDLE_CAMPED     -> IDLE;
//   3 CONNECTING      -> ATMPT_CONNECTION (from the request until the setup is complete);
//   4 CONNECTED       -> CONNECTED;
//   7 CLOSING         -> ENDING (after a release, until the modem is idle again).
std::optional<std::int32_t> stateOfEvent(std::uint8_t state) {
    switch (state) {
        case 1:
            return KLTE_RRC_STATE_NULL;
        case 2:
            return KLTE_RRC_STATE_IDLE;
        case 3:
            return KLTE_RRC_STATE_ATMPT_CONNECTION;
        case 4:
            return KLTE_RRC_STATE_CONNECTED;
        case 7:
            return KLTE_RRC_STATE_ENDING;
        default:
            return std::nullopt;
    }
}

bool rrcStateChange(const EventReport& event, DecodeState& state, std::vector<MetricOut>& out) {
    if (event.payload.size() != 1) return false;
    const auto next = stateOfEvent(event.payload[0]);
    if (!next) return false;
    state.lte.rrc.fromEvents = true;
    tell({*next, true, {}}, event.timeMs, state.lte.rrc, out);
    return true;
}

// ---- LTE RRC OTA packet (0xB0C0) ----

// The logical channels, in the order of the pdu_num tables below.
enum class Channel { BcchBch, BcchDlSch, Mcch, Pcch, DlCcch, DlDcch, UlCcch, UlDcch };
constexpr std::size_t kChannels = 8;
using PduNums = std::array<std::uint8_t, kChannels>;

// pdu_num of each channel, by version (SCAT parse_lte_rrc; the peers' vectors v034-v044 and
// v116-v127 agree). A version missing here, or a pdu_num not in its table (NB-IoT channels,
// say), is refused: the table changes from version to version, and a guess could read a
// paging message as a release.
// In the order BCCH-BCH, BCCH-DL-SCH, MCCH, PCCH, DL-CCCH, DL-DCCH, UL-CCCH, UL-DCCH:
constexpr PduNums kFrom1 = {1, 2, 3, 4, 5, 6, 7, 8};
constexpr PduNums kFrom8 = {8, 9, 10, 11, 12, 13, 14, 15};
constexpr PduNums kSkip3 = {1, 2, 4, 5, 6, 7, 8, 9};
constexpr PduNums kSkip2And4And5 = {1, 3, 6, 7, 8, 9, 10, 11};
struct OtaVersion {
    std::uint8_t version;
    const PduNums* pduNums;
};
constexpr OtaVersion kOtaVersions[] = {
    {2, &kFrom1},          {3, &kFrom1},          {4, &kFrom1},          {6, &kFrom1},
    {7, &kFrom1},          {8, &kFrom1},          {13, &kFrom1},         {22, &kFrom1},
    {9, &kFrom8},          {12, &kFrom8},         {14, &kSkip3},         {15, &kSkip3},
    {16, &kSkip3},         {20, &kSkip3},         {24, &kSkip3},         {25, &kSkip3},
    {19, &kSkip2And4And5}, {26, &kSkip2And4And5}, {27, &kSkip2And4And5}, {29, &kSkip2And4And5},
    {30, &kSkip2And4And5}, {31, &kSkip2And4And5},
};

std::optional<Channel> channelOf(std::uint8_t version, std::uint8_t pduNum) {
    for (const OtaVersion& v : kOtaVersions) {
        if (v.version != version) continue;
        const auto at = std::find(v.pduNums->begin(), v.pduNums->end(), pduNum);
        if (at == v.pduNums->end()) return std::nullopt;
        return static_cast<Channel>(at - v.pduNums->begin());
    }
    return std::nullopt;
}

// Where the header's fields are, by version. After u8 version and the LTE release (2 bytes):
//   2-4:   u8 rb id, u16 PCI, u16 EARFCN, u16 SFN/subframe, u8 pdu_num, u16 length; PDU at 13;
//   5-7:   the same with a u32 SIB mask before the length; PDU at 17;
//   8-24:  the same with a u32 EARFCN; PDU at 19;
//   25-29: the NR release (2 bytes) after the LTE one; PDU at 21;
//   30-:   3 more bytes after the length, the last the segment id; PDU at 24.
struct OtaHeader {
    std::size_t pduNum;
    std::size_t length;
    std::size_t pdu;
};
constexpr OtaHeader headerOf(std::uint8_t version) {
    if (version <= 4) return {10, 11, 13};
    if (version <= 7) return {10, 15, 17};
    if (version <= 24) return {12, 17, 19};
    if (version <= 29) return {14, 19, 21};
    return {14, 19, 24};
}
constexpr std::uint8_t kFirstSegmentedVersion = 30;
constexpr std::uint8_t kLastSegment = 7;

// What a message tells of the state. The PDU is UPER: its first bit chooses c1 (0) or the
// later releases' messageClassExtension (1), and c1's index follows in 2 bits (DL-CCCH, four
// messages), 1 bit (UL-CCCH, two) or 4 bits (DL-DCCH and UL-DCCH, sixteen) (TS 36.331).
// The state follows the modem's own events (mi-offline_log_example has both: CONNECTING as the
// request goes out, CONNECTED only after RRCConnectionSetupComplete), so that a screen fed
// by the OTA messages shows what one fed by the events would:
//   UL-CCCH RRCConnectionRequest: attempting a connection, from now, after idle;
//     RRCConnectionReestablishmentRequest: the same after a connection (the lost one is
//     re-attempted);
//   DL-CCCH RRCConnectionSetup, RRCConnectionReestablishment: still attempting, until the
//     phone's answer; RRCConnectionReject, RRCConnectionReestablishmentReject: idle, from now,
//     after the attempt;
//   UL-DCCH RRCConnectionSetupComplete, RRCConnectionReestablishmentComplete: connected, from
//     now, after the attempt; any other DCCH message: connected (a DCCH exists only in a
//     connection), since a time unknown when it is the first to say so;
//   DL-DCCH RRCConnectionRelease: idle, from now, after the connection (TS 36.331 5.3.8: the
//     phone leaves RRC_CONNECTED at most 60 ms later; the modem's CLOSING, which only the event
//     shows, is that moment).
// BCCH, PCCH and MCCH messages come in every state and tell nothing. A CCCH message of the
// extension is not known here: refused.
struct Reading {
    bool known = true;
    std::optional<Told> told;
};
Reading readingOf(Channel channel, std::uint8_t firstByte) {
    constexpr std::int32_t kIdle = KLTE_RRC_STATE_IDLE;
    constexpr std::int32_t kAttempt = KLTE_RRC_STATE_ATMPT_CONNECTION;
    constexpr std::int32_t kConnected = KLTE_RRC_STATE_CONNECTED;
    const bool extension = (firstByte & 0x80) != 0;
    switch (channel) {
        case Channel::DlCcch: {
            if (extension) return {false, {}};
            constexpr std::uint8_t kReestablishment = 0, kSetup = 3;
            const std::uint8_t c1 = (firstByte >> 5) & 0x03;
            if (c1 == kReestablishment) return {true, Told{kAttempt, false, kConnected}};
            if (c1 == kSetup) return {true, Told{kAttempt, false, kIdle}};
            return {true, Told{kIdle, true, kAttempt}};  // a reject, of either kind
        }
        case Channel::UlCcch: {
            if (extension) return {false, {}};
            const bool request = ((firstByte >> 6) & 0x01) != 0;
            return {true, Told{kAttempt, true, request ? kIdle : kConnected}};
        }
        case Channel::DlDcch: {
            constexpr std::uint8_t kRelease = 5;
            if (!extension && ((firstByte >> 3) & 0x0F) == kRelease)
                return {true, Told{kIdle, true, kConnected}};
            return {true, Told{kConnected, false, {}}};
        }
        case Channel::UlDcch: {
            constexpr std::uint8_t kReestablishmentComplete = 3, kSetupComplete = 4;
            const std::uint8_t c1 = (firstByte >> 3) & 0x0F;
            if (!extension && (c1 == kReestablishmentComplete || c1 == kSetupComplete))
                return {true, Told{kConnected, true, kAttempt}};
            return {true, Told{kConnected, false, {}}};
        }
        default:
            return {};
    }
}

// The OTA packet: the header as above, the PDU exactly as long as the header says (a shorter
// or longer packet is refused: its header is not the one we read). From version 30 a long
// message comes in segments: the leading one (id 1) starts with the message's first bits,
// the others (2-6, and 7 for the last) continue it and tell nothing by themselves.
bool rrcOta(const LogPacket& packet, DecodeState& state, std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    if (r.size() < 1) return false;
    const std::uint8_t version = r.u8(0);
    const OtaHeader header = headerOf(version);
    if (r.size() <= header.pdu) return false;
    const std::size_t length = r.u16(header.length);
    if (length == 0 || r.size() - header.pdu != length) return false;
    const auto channel = channelOf(version, r.u8(header.pduNum));
    if (!channel) return false;
    if (version >= kFirstSegmentedVersion) {
        const std::uint8_t segment = r.u8(header.pdu - 1);
        if (segment > kLastSegment) return false;
        if (segment > 1) return true;
    }
    const Reading reading = readingOf(*channel, r.u8(header.pdu));
    if (!reading.known) return false;
    if (reading.told && !state.lte.rrc.fromEvents)
        tell(*reading.told, packet.timeMs, state.lte.rrc, out);
    return true;
}

// One row per version of the pdu_num table, all read by rrcOta.
constexpr auto kRows = [] {
    std::array<LogDecoderRow, std::size(kOtaVersions)> rows{};
    for (std::size_t i = 0; i < rows.size(); ++i)
        rows[i] = {0xB0C0, kOtaVersions[i].version, "LTE RRC OTA", rrcOta};
    return rows;
}();

constexpr EventDecoderRow kEventRows[] = {
    {1606, "LTE RRC state change", rrcStateChange},
};

}  // namespace

std::span<const LogDecoderRow> lteRrcDecoders() {
    return kRows;
}

std::span<const EventDecoderRow> eventDecoders() {
    return kEventRows;
}

}  // namespace pyx::diag
