// LTE log packets of the serving cell and of idle mode: the serving cell's identity (RRC
// serving cell info 0xB0C2, with the MIB 0xB0C1 and the ML1 serving cell info 0xB197 for its
// bandwidth), the serving cell's measurement and evaluation (0xB17F) and the neighbours'
// measurements (0xB180).
#include <memory>
#include <optional>

#include "messages/Messages.h"
#include "sources/diag/DecodeState.h"
#include "sources/diag/LogDecoder.h"
#include "sources/diag/decode/ByteReader.h"
#include "sources/modem/Bands.h"

namespace pyx::diag {

namespace {

using decode::Reader;
namespace id = decode::id;

constexpr std::uint32_t kMaxEarfcn = 262143;  // TS 36.101: an EARFCN is 18 bits
constexpr std::uint32_t kMaxPci = 503;
constexpr std::uint32_t kMaxCellIdentity = 0x0FFFFFFF;  // 28 bits
constexpr std::uint32_t kMaxBand = 256;                 // FreqBandIndicator-v9e0

// A downlink bandwidth as the packets give it (resource blocks), when it is one of LTE's six.
std::optional<std::uint32_t> bandwidthPrb(std::uint32_t prb) {
    for (const std::uint32_t valid : {6U, 15U, 25U, 50U, 75U, 100U})
        if (prb == valid) return prb;
    return std::nullopt;
}

// A level in 1/16 dB steps rounded to whole (perStep 16) or half (perStep 8) units, a tie
// going to the stronger value.
std::int32_t roundedSteps(std::int32_t sixteenths, std::int32_t perStep) {
    const std::int32_t shifted = sixteenths + perStep / 2;
    return shifted >= 0 ? shifted / perStep : -((perStep - 1 - shifted) / perStep);  // floor
}
// RSRP is raw / 16 - 180 dBm, RSRQ raw / 16 - 30 dB (12 and 10 bits).
std::int32_t rsrpDbm(std::uint32_t raw) {
    return roundedSteps(static_cast<std::int32_t>(raw) - 180 * 16, 16);
}
std::int32_t rsrqDb(std::uint32_t raw) {
    return roundedSteps(static_cast<std::int32_t>(raw) - 30 * 16, 16);
}
// A neighbour's levels as its message holds them: RSRP + 140 (dBm), (RSRQ + 19.5) x 2 (dB).
std::int32_t neighbourRsrpIndex(std::uint32_t raw) {
    return rsrpDbm(raw) + 140;
}
std::int32_t neighbourRsrqIndex(std::uint32_t raw) {
    return roundedSteps(static_cast<std::int32_t>(raw) - 30 * 16 + 39 * 8, 8);
}

// The serving-cell info, whole, as the state holds it. The bandwidths are written in half
// resource blocks, as the store expects them (it halves them for the screen).
void writeServingCell(const LteServingCell& cell, std::uint64_t timeMs,
                      std::vector<MetricOut>& out) {
    KCellularLteScellInfo m;
    m.setTimestamp(timeMs);
    m.setPhyCellId(cell.pci);
    m.setDlFreq(cell.dlEarfcn);
    if (cell.ulEarfcn) m.setUlFreq(*cell.ulEarfcn);
    if (cell.dlBandwidthPrb) m.setDlBw(*cell.dlBandwidthPrb * 2);
    if (cell.ulBandwidthPrb) m.setUlBw(*cell.ulBandwidthPrb * 2);
    if (cell.cellIdentity) m.setCellId(*cell.cellIdentity);
    if (cell.band) m.setFreqBandInd(*cell.band);
    if (cell.tac) m.setTrackingAreaCode(*cell.tac);
    if (cell.plmn) {
        m.setNumMncDigits(cell.plmn->mncDigits);
        m.setSelPlmnMcc(cell.plmn->mcc);
        m.setSelPlmnMnc(cell.plmn->mnc);
    }
    out.push_back({id::K_LTE_SCELL_INFO, m.data()});
}

// A PLMN in the binary form: u16 MCC, u8 number of MNC digits, u16 MNC. Nothing when it is
// not one (MCC past 999, 2 or 3 digits, an MNC of more digits).
std::optional<decode::PlmnDigits> binaryPlmn(std::uint32_t mcc, std::uint32_t digits,
                                             std::uint32_t mnc) {
    if (mcc > 999 || (digits != 2 && digits != 3) || mnc > (digits == 2 ? 99U : 999U))
        return std::nullopt;
    return decode::PlmnDigits{mcc, mnc, digits};
}

// RRC serving cell info: u8 version, u16 PCI, DL and UL EARFCN (u16 in version 2, u32 in 3),
// u8 DL and UL bandwidth (resource blocks), u32 cell identity, u16 TAC, u32 band, u16 MCC,
// u8 MNC digits, u16 MNC, u8 allowed access. A bandwidth that is not one of LTE's six (v050,
// an NB-IoT carrier, has 0) is left out, or kept from the MIB of the same cell; a band that
// is none (0, past 256) is derived from the EARFCN, as the ModemManager source derives it;
// an uplink EARFCN, cell identity (28 bits) or PLMN that is none is left out.
bool rrcServingCellInfo(const LogPacket& packet, DecodeState& state, std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    if (r.size() < 1) return false;
    const std::size_t width = r.u8(0) == 2 ? 2 : r.u8(0) == 3 ? 4 : 0;
    if (width == 0) return false;
    const std::size_t rest = 3 + 2 * width;  // the bandwidths
    if (!r.fits(0, rest + 18)) return false;
    const auto earfcn = [&](std::size_t at) { return width == 2 ? r.u16(at) : r.u32(at); };

    LteServingCell cell;
    cell.pci = r.u16(1);
    cell.dlEarfcn = earfcn(3);
    if (cell.pci > kMaxPci || cell.dlEarfcn > kMaxEarfcn) return false;
    if (const std::uint32_t ul = earfcn(3 + width); ul <= kMaxEarfcn) cell.ulEarfcn = ul;
    cell.dlBandwidthPrb = bandwidthPrb(r.u8(rest));
    cell.ulBandwidthPrb = bandwidthPrb(r.u8(rest + 1));
    if (const std::uint32_t eci = r.u32(rest + 2); eci <= kMaxCellIdentity) cell.cellIdentity = eci;
    cell.tac = r.u16(rest + 6);
    if (const std::uint32_t band = r.u32(rest + 8); band >= 1 && band <= kMaxBand)
        cell.band = band;
    else
        cell.band = modem::lteBandOfEarfcn(cell.dlEarfcn);
    cell.plmn = binaryPlmn(r.u16(rest + 12), r.u8(rest + 14), r.u16(rest + 15));

    const auto& known = state.lte.serving.cell;
    if (!cell.dlBandwidthPrb && known && known->dlEarfcn == cell.dlEarfcn && known->pci == cell.pci)
        cell.dlBandwidthPrb = known->dlBandwidthPrb;
    state.lte.serving.cell = cell;
    writeServingCell(cell, packet.timeMs, out);
    return true;
}

// What a MIB or the ML1 serving cell info says of the serving cell: its DL EARFCN, PCI and
// bandwidth. The same cell keeps what 0xB0C2 said of it; another cell starts anew, its band
// derived from its EARFCN.
bool servingCellSeen(std::uint32_t dlEarfcn, std::uint32_t pci, std::uint32_t prb,
                     const LogPacket& packet, DecodeState& state, std::vector<MetricOut>& out) {
    if (pci > kMaxPci || dlEarfcn > kMaxEarfcn) return false;
    auto& known = state.lte.serving.cell;
    if (!known || known->dlEarfcn != dlEarfcn || known->pci != pci) {
        known = LteServingCell{};
        known->dlEarfcn = dlEarfcn;
        known->pci = pci;
        known->band = modem::lteBandOfEarfcn(dlEarfcn);
    }
    if (const auto bandwidth = bandwidthPrb(prb)) known->dlBandwidthPrb = bandwidth;
    writeServingCell(*known, packet.timeMs, out);
    return true;
}

// RRC MIB: u8 version, u16 PCI, EARFCN (u16 in version 1, u32 from 2), u16 SFN, u8 number of
// Tx antennas, u8 DL bandwidth (resource blocks); version 3 adds a byte of SIB1-BR
// scheduling. The antennas have no field in our serving-cell class.
bool rrcMib(const LogPacket& packet, DecodeState& state, std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    if (r.size() < 1) return false;
    const std::uint8_t version = r.u8(0);
    if (version < 1 || version > 3) return false;
    const std::size_t width = version == 1 ? 2 : 4;
    const std::size_t size = 3 + width + 4 + (version == 3 ? 1 : 0);
    if (r.size() < size) return false;
    const std::uint32_t earfcn = width == 2 ? r.u16(3) : r.u32(3);
    return servingCellSeen(earfcn, r.u16(1), r.u8(3 + width + 3), packet, state, out);
}

// ML1 serving cell info: u8 version, u8 DL bandwidth (resource blocks), u16 SFN, EARFCN (u16
// in version 1, u32 in 2), PCI (b0-8; u16 in version 1, u32 in 2) with the PBCH and PHICH
// fields, u32 PSS, u32 SSS, u64 reference time, u32 MIB bytes, i16 frequency offset, u16
// number of antennas.
bool ml1ServingCellInfo(const LogPacket& packet, DecodeState& state, std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    if (r.size() < 1) return false;
    const std::size_t width = r.u8(0) == 1 ? 2 : r.u8(0) == 2 ? 4 : 0;
    if (width == 0) return false;
    if (r.size() < 4 + 2 * width + 24) return false;
    const std::uint32_t earfcn = width == 2 ? r.u16(4) : r.u32(4);
    const std::uint32_t pci = r.u16(4 + width) & 0x1FF;
    return servingCellSeen(earfcn, pci, r.u8(1), packet, state, out);
}

// The header of 0xB17F and 0xB180: u8 version, u8 RRC release (1: the Rel-9 fields are
// there), u16 reserved, EARFCN (u16 in version 4, u32 in 5), then a u16 (version 4) or u32
// (version 5) of cell or list fields.
struct Ml1Header {
    bool rel9 = false;
    std::uint32_t earfcn = 0;
    std::uint32_t word = 0;  // the u16 or u32 after the EARFCN
    std::size_t end = 0;     // where the next field starts
};

std::optional<Ml1Header> ml1Header(const Reader& r) {
    if (r.size() < 1) return std::nullopt;
    const std::size_t width = r.u8(0) == 4 ? 2 : r.u8(0) == 5 ? 4 : 0;
    if (width == 0 || !r.fits(0, 4 + 2 * width)) return std::nullopt;
    const std::uint8_t release = r.u8(1);
    if (release > 1) return std::nullopt;  // a release whose fields no peer names
    Ml1Header h;
    h.rel9 = release == 1;
    h.earfcn = width == 2 ? r.u16(4) : r.u32(4);
    h.word = width == 2 ? r.u16(4 + width) : r.u32(4 + width);
    h.end = 4 + 2 * width;
    if (h.earfcn > kMaxEarfcn) return std::nullopt;
    return h;
}

// ML1 serving cell measurement and evaluation (idle): the header (PCI b0-8 and the serving
// layer's priority b9-15 in its word), then u32 words: measured RSRP (b0-11), averaged RSRP
// (b0-11), RSRQ (measured b0-9, averaged b20-29), RSSI (b10-20), the S-criterion's
// Qrxlevmin, Pmax and Srxlev, the search thresholds and, with Rel-9, Qqualmin and Squal.
// RSRP and RSRQ go to the serving cell's measurement as the ModemManager source writes them:
// whole dBm and dB, the measured values as the sample and the modem's averages as the
// average. No class of ours holds the RSSI. The S-criterion's fields are left out: no peer
// gives their scaling, and their raw values do not check out against the measured levels.
bool servingCellMeasEval(const LogPacket& packet, DecodeState& /*state*/,
                         std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    const auto h = ml1Header(r);
    if (!h) return false;
    const std::size_t words = h->end;
    if (!r.fits(words, h->rel9 ? 28 : 24)) return false;
    const std::uint32_t pci = h->word & 0x1FF;
    if (pci > kMaxPci) return false;

    const std::uint32_t rsrq = r.u32(words + 8);
    const auto sample = [&](std::uint32_t rsrpRaw, std::uint32_t rsrqRaw) {
        auto v = std::make_shared<RsrpRsrqSinr>();
        v->setPhyCellId(pci);
        v->setRsrp0(rsrpDbm(rsrpRaw & 0xFFF));
        v->setRsrq0(rsrqDb(rsrqRaw & 0x3FF));
        return v;
    };
    KCellularLteRsrpRsrqSinr m;
    m.setTimestamp(packet.timeMs);
    m.setNumSamples(1);
    m.addInstValue(sample(r.u32(words), rsrq));
    m.setAvgValues(sample(r.u32(words + 4), rsrq >> 20));
    out.push_back({id::K_LTE_RSRP_RSRQ_SINR, m.data()});
    return true;
}

// ML1 neighbour measurements (idle), one frequency layer: the header (Qrxlevmin b0-5 and the
// cell count b6- in its word), then 32 bytes a cell: u32 with PCI b0-8, RSSI b9-19 and
// measured RSRP b20-31; u32 with the averaged RSRP b12-23; u32 with the measured RSRQ
// b12-21; u32 with the averaged RSRQ b0-9 and Srxlev b20-25; u16 frequency offset, u16, two
// u32 antenna timing offsets and, with Rel-9, Squal.
bool neighbourMeasurements(const LogPacket& packet, DecodeState& /*state*/,
                           std::vector<MetricOut>& out) {
    constexpr std::size_t kCell = 32;
    const Reader r(packet.payload);
    const auto h = ml1Header(r);
    if (!h) return false;
    const std::size_t cells = h->word >> 6;
    if (!r.fits(h->end, cells * kCell)) return false;

    KCellularLteNbrEutraCellMeas m;
    m.setTimestamp(packet.timeMs);
    const auto band = modem::lteBandOfEarfcn(h->earfcn);
    for (std::size_t i = 0; i < cells; ++i) {
        const std::size_t at = h->end + i * kCell;
        const std::uint32_t w0 = r.u32(at);
        const std::uint32_t pci = w0 & 0x1FF;
        if (pci > kMaxPci) return false;
        auto cell = std::make_shared<EgwErrcNbrEutraMeas>();
        cell->setNbrEarfcn(h->earfcn);
        cell->setNbrPhysCellId(pci);
        if (band) cell->setFreqBandInd(*band);
        cell->setNbrRsrp(neighbourRsrpIndex(w0 >> 20));
        cell->setNbrRsrq(neighbourRsrqIndex((r.u32(at + 8) >> 12) & 0x3FF));
        m.addMeasNbrEutra(std::move(cell));
    }
    out.push_back({id::K_LTE_INTRARAT_MEAS, m.data()});
    return true;
}

constexpr LogDecoderRow kRows[] = {
    {0xB0C2, 2, "LTE RRC serving cell info", rrcServingCellInfo},
    {0xB0C2, 3, "LTE RRC serving cell info", rrcServingCellInfo},
    {0xB0C1, 1, "LTE RRC MIB", rrcMib},
    {0xB0C1, 2, "LTE RRC MIB", rrcMib},
    {0xB0C1, 3, "LTE RRC MIB", rrcMib},
    {0xB197, 1, "LTE ML1 serving cell info", ml1ServingCellInfo},
    {0xB197, 2, "LTE ML1 serving cell info", ml1ServingCellInfo},
    {0xB17F, 4, "LTE ML1 serving cell measurement and evaluation", servingCellMeasEval},
    {0xB17F, 5, "LTE ML1 serving cell measurement and evaluation", servingCellMeasEval},
    {0xB180, 4, "LTE ML1 neighbour measurements", neighbourMeasurements},
    {0xB180, 5, "LTE ML1 neighbour measurements", neighbourMeasurements},
};

}  // namespace

std::span<const LogDecoderRow> lteServingDecoders() {
    return kRows;
}

}  // namespace pyx::diag
