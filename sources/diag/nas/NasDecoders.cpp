// NAS log packets: the EMM state (0xB0EE), the EPS bearers (0xB0E5), and the GMM and MM
// states (0x7130, 0x7131). Their layouts are those the MobileInsight decoder reads; the
// values were checked by hand against the NAS messages of the captures.
#include <memory>

#include "messages/Messages.h"
#include "sources/diag/DecodeState.h"
#include "sources/diag/LogDecoder.h"
#include "sources/diag/decode/ByteReader.h"
#include "sources/diag/nas/NasRegistration.h"

namespace pyx::diag {

namespace {

using decode::Reader;
namespace id = decode::id;

constexpr std::uint8_t kFirstEpsBearerId = 5;
constexpr std::uint8_t kLastEpsBearerId = 15;

// The active bearers as our bearer list shows them, in identity order. An EPS bearer's
// identity is also its NSAPI (3GPP TS 23.401), the one field of ours it fills; QCI and bit
// rates have none.
MetricOut activeBearers(const NasState& nas, std::uint64_t timeMs) {
    KCellularActivatedBearerContexts m;
    m.setTimestamp(timeMs);
    std::uint32_t count = 0;
    for (std::uint8_t bearerId = kFirstEpsBearerId; bearerId <= kLastEpsBearerId; ++bearerId) {
        if ((nas.activeBearers >> bearerId & 1U) == 0) continue;
        auto context = std::make_shared<BearerContext>();
        context->setNsapi(bearerId);
        m.addBearerContext(std::move(context));
        ++count;
    }
    m.setBearerContextCount(count);
    return {id::K_CELLULAR_ACTIVE_BEARER, m.data()};
}

// EMM state version 2: u8 version, u8 EMM state, u16 substate, PLMN (3 B BCD), u8 GUTI valid,
// u8 UE identity type, GUTI PLMN (3 B BCD), u16 MMEGI, u8 MMEC, u32 M-TMSI. MMEGI and M-TMSI
// are little-endian: the captures' attach and detach requests carry the same GUTI
// big-endian (fa e6 e9 d7 22 68 b1 for the record's e6 fa e9 b1 68 22 d7). Neither PLMN has
// a field of ours (the TAI list is the network's list, and no TAC comes with this packet).
// Deregistered (or EMM NULL), the modem holds no EPS bearer (TS 24.301): the bearer list
// empties.
bool emmState(const LogPacket& packet, DecodeState& state, std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    if (r.size() < 19) return false;
    const std::uint8_t emm = r.u8(1);
    const std::uint16_t substate = r.u16(2);

    KCellularEmmContext m;
    m.setTimestamp(packet.timeMs);
    if (const auto status = emmRegStatus(emm, substate)) m.setRegStatus(*status);
    if (const auto proc = emmRegProc(emm)) m.setRegProc(*proc);
    if (r.u8(7) != 0) {
        auto guti = std::make_shared<Guti>();
        guti->setMmegi(r.u16(12));
        guti->setMmec(r.u8(14));
        guti->setMTmsi(r.u32(15));
        m.setGuti(std::move(guti));
    }
    out.push_back({id::K_LTE_EMM_CTXT, m.data()});

    constexpr std::uint8_t kNull = 0, kDeregistered = 1;
    if ((emm == kNull || emm == kDeregistered) && state.nas.activeBearers != 0) {
        state.nas.activeBearers = 0;
        out.push_back(activeBearers(state.nas, packet.timeMs));
    }
    return true;
}

// ESM bearer state version 1: u8 version, u8 bearer type (0 default, 1 dedicated), u8 EPS
// bearer identity, u8 state, 6 bytes, u8 QoS length, u8 QCI, u8 UL/DL MBR, u8 UL/DL GBR, and
// their four extensions: 20 bytes. The states as the captures show them against the ESM
// messages around them: 1 on an activation request, 2 once active (again after each service
// request), 3 on a modification request, 0 when deactivated. A deactivation record may carry
// identity 0 (sprint, after the deactivation of bearer 5): it names no bearer, so none
// leaves; the list still empties when EMM deregisters.
bool esmBearerState(const LogPacket& packet, DecodeState& state, std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    if (r.size() < 20) return false;
    const std::uint8_t bearerId = r.u8(2);
    const std::uint8_t bearerState = r.u8(3);
    const bool named = bearerId >= kFirstEpsBearerId && bearerId <= kLastEpsBearerId;
    const auto bit = static_cast<std::uint16_t>(named ? 1U << bearerId : 0U);

    constexpr std::uint8_t kInactive = 0, kModifyPending = 3;
    if (bearerState == kInactive) {
        if (!named && bearerId != 0) return false;
        state.nas.activeBearers = static_cast<std::uint16_t>(state.nas.activeBearers & ~bit);
    } else if (bearerState <= kModifyPending) {
        if (!named) return false;
        state.nas.activeBearers = static_cast<std::uint16_t>(state.nas.activeBearers | bit);
    } else {
        return false;  // a state the captures do not show
    }
    out.push_back(activeBearers(state.nas, packet.timeMs));
    return true;
}

// GMM state: u8 state, u8 substate, u8 update status; no version byte.
bool gmmState(const LogPacket& packet, DecodeState&, std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    if (r.size() < 3) return false;
    KCellularGmmContext m;
    m.setTimestamp(packet.timeMs);
    if (const auto status = gmmRegStatus(r.u8(0), r.u8(1))) m.setRegStatus(*status);
    if (const auto update = gmmUpdateStatus(r.u8(2))) m.setUpdateStatus(*update);
    if (const auto proc = gmmRegProc(r.u8(0))) m.setRegProc(*proc);
    out.push_back({id::K_CELLULAR_GMM_CTXT, m.data()});
    return true;
}

// MM state: u8 state, u8 substate, u8 update status; no version byte.
bool mmState(const LogPacket& packet, DecodeState&, std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    if (r.size() < 3) return false;
    KCellularMmContext m;
    m.setTimestamp(packet.timeMs);
    if (const auto status = mmRegStatus(r.u8(0), r.u8(1))) m.setRegStatus(*status);
    if (const auto update = mmUpdateStatus(r.u8(2))) m.setUpdateStatus(*update);
    out.push_back({id::K_CELLULAR_MM_CTXT, m.data()});
    return true;
}

constexpr LogDecoderRow kRows[] = {
    {0xB0EE, 2, "LTE NAS EMM state", emmState},
    {0xB0E5, 1, "LTE NAS ESM bearer state", esmBearerState},
    {0x7130, kAnyVersion, "UMTS NAS GMM state", gmmState},
    {0x7131, kAnyVersion, "UMTS NAS MM state", mmState},
};

}  // namespace

std::span<const LogDecoderRow> nasDecoders() {
    return kRows;
}

}  // namespace pyx::diag
