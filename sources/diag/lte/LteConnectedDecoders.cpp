// LTE connected-mode measurements: the serving cell measurement response (0xB193), one entry
// per serving carrier and so the state of carrier aggregation, and the connected-mode
// neighbour measurements (0xB195). Both are sub-packet containers: u8 version (1), u8 count,
// u16 reserved, then per sub-packet u8 id, u8 version, u16 size (the 4-byte header included).
// Every (id, version) pair a packet holds must be known, or the packet is refused.
#include <algorithm>
#include <array>
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

// A field of bits of the little-endian u32 at a cell's offset.
struct Field {
    std::size_t offset;
    unsigned shift;
    unsigned width;
};

std::uint32_t read(const Reader& r, std::size_t cell, Field f) {
    return (r.u32(cell + f.offset) >> f.shift) & ((1U << f.width) - 1);
}

// The nearest integer to num / den (den > 0), halves away from zero.
std::int32_t nearest(std::int64_t num, std::int64_t den) {
    return static_cast<std::int32_t>(num >= 0 ? (num + den / 2) / den : -((-num + den / 2) / den));
}

// The modem's units: RSRP x/16 - 180 dBm, RSRQ x/16 - 30 dB, RSSI x/16 - 110 dBm,
// SNR x/10 - 20 dB; here as our messages hold them.
constexpr std::int64_t kRsrpFloor = 2880;  // 180 dB in sixteenths
constexpr std::int64_t kRsrqFloor = 480;   // 30 dB
constexpr std::int64_t kRssiFloor = 1760;  // 110 dB
constexpr std::int64_t kSnrFloor = 200;    // 20 dB in tenths

std::int32_t rsrpDbm(std::uint32_t x) {
    return nearest(std::int64_t{x} - kRsrpFloor, 16);
}
std::int32_t rsrqDb(std::uint32_t x) {
    return nearest(std::int64_t{x} - kRsrqFloor, 16);
}
std::int32_t rsrpCentiDb(std::uint32_t x) {
    return nearest((std::int64_t{x} - kRsrpFloor) * 100, 16);
}
std::int32_t rsrqCentiDb(std::uint32_t x) {
    return nearest((std::int64_t{x} - kRsrqFloor) * 100, 16);
}
std::int32_t rssiCentiDb(std::uint32_t x) {
    return nearest((std::int64_t{x} - kRssiFloor) * 100, 16);
}
std::int32_t snrHalfDb(std::uint32_t x) {
    return nearest(std::int64_t{x} - kSnrFloor, 5);
}
std::int32_t snrDb(std::uint32_t x) {
    return nearest(std::int64_t{x} - kSnrFloor, 10);
}
// A neighbour's RSRP as dBm + 140 (0 for -140 dBm or less, 97 for -43 dBm or more) and RSRQ
// as (dB + 19.5) x 2 (0 to 34), the indices the neighbour lists hold.
std::int32_t rsrpIndex(std::uint32_t x) {
    return std::clamp(rsrpDbm(x) + 140, 0, 97);
}
std::int32_t rsrqIndex(std::uint32_t x) {
    // (x/16 - 30 + 19.5) x 2 = (x - 168) / 8
    constexpr std::int64_t kRsrqIndexFloor = 168;
    return std::clamp(nearest(std::int64_t{x} - kRsrqIndexFloor, 8), 0, 34);
}

bool fresh(std::uint64_t measuredMs, std::uint64_t nowMs) {
    const std::uint64_t age = nowMs >= measuredMs ? nowMs - measuredMs : measuredMs - nowMs;
    return age <= kLteMeasurementKeptMs;
}

// Whether count cells of cellSize bytes follow header bytes of a sub-packet body, the body
// holding whole cells only (the modem may leave room for more cells than it fills).
bool cellsFit(const Reader& body, std::size_t header, std::size_t count, std::size_t cellSize) {
    if (!body.fits(0, header)) return false;
    const std::size_t room = body.size() - header;
    return count <= room / cellSize && room % cellSize == 0;
}

// ---- 0xB193 serving cell measurement response, sub-packet 0x19 ----------------------------

constexpr std::uint8_t kServingCellMeasId = 0x19;

// Where a version of the serving cell measurement result keeps a cell's fields. A cell starts
// with a u16: PCI b0-8, serving-cell index b9-11, is-serving b12; SFN and subframe follow.
struct ScmrLayout {
    std::uint8_t version;
    std::size_t header;  // bytes before the first cell: u32 EARFCN, then as below
    bool counted;        // a u16 cell count at [4]; else the one cell is the serving cell
    bool validRx;        // a u16 mask of the valid receive chains at [6] (b0 chain 0, b1 chain 1)
    std::size_t cellSize;
    std::array<Field, 2> rsrpRx;
    std::array<Field, 2> rsrqRx;
    std::array<Field, 2> snrRx;
    Field rsrp;  // over the receive chains; raw + rsrpAdd
    std::uint32_t rsrpAdd;
    Field rsrq;
    Field rssi;
};

// v18 and v19 as MobileInsight's v19 table reads them; v18 is the EARFCN and one such cell
// (MobileInsight's own v18 table reads the powers a byte late, which gives -179.7 dBm on
// every packet of the offline capture). v36 as SCAT and MobileInsight's v35 table read it,
// with the combined RSRP 40 dB low. v48 as SCAT reads its header, cell size and SNR; its
// powers sit one word later from the combined RSRP on (as MobileInsight's v40 table has
// them), which the peers' v48 sample confirms: on both its cells the combined RSRP, RSRQ
// and RSSI equal those of the better receive chain to the bit.
// clang-format off
constexpr ScmrLayout kScmrLayouts[] = {
    // version, header, counted, validRx, cell size,
    //   RSRP rx0/rx1, RSRQ rx0/rx1, SNR rx0/rx1, RSRP (+ add), RSRQ, RSSI
    {18, 4, false, false, 88,
     {{{16, 10, 12}, {20, 12, 12}}}, {{{28, 12, 10}, {32, 0, 10}}}, {{{64, 0, 9}, {64, 9, 9}}},
     {24, 12, 12}, 0, {32, 20, 10}, {40, 0, 11}},
    {19, 8, true, false, 88,
     {{{16, 10, 12}, {20, 12, 12}}}, {{{28, 12, 10}, {32, 0, 10}}}, {{{64, 0, 9}, {64, 9, 9}}},
     {24, 12, 12}, 0, {32, 20, 10}, {40, 0, 11}},
    {36, 8, true, true, 128,
     {{{16, 10, 12}, {20, 12, 12}}}, {{{36, 0, 10}, {36, 20, 10}}}, {{{80, 0, 9}, {80, 9, 9}}},
     {28, 12, 12}, 640, {44, 0, 10}, {56, 0, 11}},
    {48, 12, true, true, 140,
     {{{16, 10, 12}, {20, 12, 12}}}, {{{40, 0, 10}, {40, 20, 10}}}, {{{92, 0, 9}, {92, 9, 9}}},
     {32, 12, 12}, 640, {48, 0, 10}, {60, 0, 11}},
};
// clang-format on

// Every field of a cell lies inside the cell, so that a cell that fits is read within bounds.
constexpr bool fieldFits(Field f, std::size_t cellSize) {
    return f.offset + 4 <= cellSize && f.shift + f.width <= 32;
}
constexpr bool layoutsFit() {
    for (const ScmrLayout& l : kScmrLayouts) {
        if (l.header < (l.validRx ? 8U : l.counted ? 6U : 4U)) return false;
        for (const Field f : {l.rsrpRx[0], l.rsrpRx[1], l.rsrqRx[0], l.rsrqRx[1], l.snrRx[0],
                              l.snrRx[1], l.rsrp, l.rsrq, l.rssi})
            if (!fieldFits(f, l.cellSize)) return false;
    }
    return true;
}
static_assert(layoutsFit());

const ScmrLayout* scmrLayout(std::uint8_t version) {
    for (const ScmrLayout& layout : kScmrLayouts)
        if (layout.version == version) return &layout;
    return nullptr;
}

// One cell of a serving cell measurement result, in the modem's units.
struct MeasuredCell {
    std::uint32_t pci = 0;
    std::uint32_t index = 0;
    bool serving = false;
    std::array<std::optional<std::uint32_t>, 2> rsrpRx;
    std::array<std::optional<std::uint32_t>, 2> rsrqRx;
    std::array<std::optional<std::uint32_t>, 2> snrRx;
    std::uint32_t rsrp = 0;
    std::uint32_t rsrq = 0;
    std::uint32_t rssi = 0;
};

struct MeasuredCarrier {
    std::uint32_t earfcn = 0;
    std::vector<MeasuredCell> cells;
};

std::optional<MeasuredCarrier> measuredCarrier(const Reader& body, const ScmrLayout& layout) {
    if (!body.fits(0, layout.header)) return std::nullopt;
    const std::size_t count = layout.counted ? body.u16(4) : 1;
    if (!cellsFit(body, layout.header, count, layout.cellSize)) return std::nullopt;
    const std::uint32_t validRx = layout.validRx ? body.u16(6) : 0x3;
    MeasuredCarrier carrier;
    carrier.earfcn = body.u32(0);
    for (std::size_t i = 0; i < count; ++i) {
        const std::size_t at = layout.header + i * layout.cellSize;
        const std::uint32_t word = body.u16(at);
        MeasuredCell cell;
        cell.pci = word & 0x1FF;
        if (cell.pci > 503) return std::nullopt;
        cell.index = word >> 9 & 0x7;
        cell.serving = !layout.counted || (word >> 12 & 1) != 0;
        for (std::size_t rx = 0; rx < 2; ++rx) {
            if ((validRx >> rx & 1) == 0) continue;
            cell.rsrpRx[rx] = read(body, at, layout.rsrpRx[rx]);
            cell.rsrqRx[rx] = read(body, at, layout.rsrqRx[rx]);
            cell.snrRx[rx] = read(body, at, layout.snrRx[rx]);
        }
        cell.rsrp = read(body, at, layout.rsrp) + layout.rsrpAdd;
        cell.rsrq = read(body, at, layout.rsrq);
        cell.rssi = read(body, at, layout.rssi);
        carrier.cells.push_back(cell);
    }
    return carrier;
}

// The primary cell's RSRP, RSRQ and SINR per receive chain (rsrp0 the first chain's), as one
// instantaneous sample; chains the modem marks not valid are left out.
MetricOut primaryCellMeasurement(const MeasuredCell& cell, std::uint64_t timeMs) {
    auto sample = std::make_shared<RsrpRsrqSinr>();
    sample->setPhyCellId(cell.pci);
    if (cell.rsrpRx[0]) sample->setRsrp0(rsrpDbm(*cell.rsrpRx[0]));
    if (cell.rsrpRx[1]) sample->setRsrp1(rsrpDbm(*cell.rsrpRx[1]));
    if (cell.rsrqRx[0]) sample->setRsrq0(rsrqDb(*cell.rsrqRx[0]));
    if (cell.rsrqRx[1]) sample->setRsrq1(rsrqDb(*cell.rsrqRx[1]));
    if (cell.snrRx[0]) sample->setSinr0(snrHalfDb(*cell.snrRx[0]));
    if (cell.snrRx[1]) sample->setSinr1(snrHalfDb(*cell.snrRx[1]));
    KCellularLteRsrpRsrqSinr m;
    m.setTimestamp(timeMs);
    m.setNumSamples(1);
    m.addInstValue(std::move(sample));
    return {id::K_LTE_RSRP_RSRQ_SINR, m.data()};
}

void remember(std::vector<LteServingCarrier>& carriers, const LteServingCarrier& carrier) {
    const auto same = std::find_if(carriers.begin(), carriers.end(),
                                   [&](const auto& c) { return c.index == carrier.index; });
    if (same != carriers.end()) {
        *same = carrier;
        return;
    }
    carriers.push_back(carrier);
    std::sort(carriers.begin(), carriers.end(),
              [](const auto& a, const auto& b) { return a.index < b.index; });
}

// The serving carriers as the last moments measured them: every one in the carrier
// aggregation status (the primary cell as index 0), the secondary ones in the secondary cell
// measurements, and their EARFCNs as the component carriers. Whether a secondary cell is
// activated, its bandwidth and its uplink are not in the packet, so they are left out.
void writeCarriers(const std::vector<LteServingCarrier>& carriers, std::uint64_t timeMs,
                   std::vector<MetricOut>& out) {
    KCellularLteCarrierAggregationStatus status;
    status.setTimestamp(timeMs);
    KCellularLteSecondaryCellMeasurements secondary;
    secondary.setTimestamp(timeMs);
    KCellularLteComponentCarrierInfo components;
    components.setTimestamp(timeMs);
    std::size_t secondaries = 0;
    for (const LteServingCarrier& c : carriers) {
        auto scc = std::make_shared<SecondaryComponentCarrier>();
        scc->setIndex(c.index);
        scc->setPci(c.pci);
        scc->setDlEarfcn(c.earfcn);
        if (const auto band = modem::lteBandOfEarfcn(c.earfcn)) scc->setDlRfBand(*band);
        scc->setRsrp(c.rsrpCentiDb);
        scc->setRsrq(c.rsrqCentiDb);
        scc->setRssi(c.rssiCentiDb);
        if (c.snrDb) scc->setSnr(*c.snrDb);
        status.addSccList(std::move(scc));
        if (c.index == 0) {
            components.setPccEarfcn(c.earfcn);
            continue;
        }
        auto meas = std::make_shared<SccRxMeasurement>();
        meas->setIndex(c.index);
        meas->setRsrp(c.rsrpCentiDb);
        meas->setRsrq(c.rsrqCentiDb);
        meas->setRssi(c.rssiCentiDb);
        if (c.snrDb) meas->setSnr(*c.snrDb);
        secondary.addSccRxMeasurement(std::move(meas));
        if (secondaries == 0) components.setScc0Earfcn(c.earfcn);
        if (secondaries == 1) components.setScc1Earfcn(c.earfcn);
        ++secondaries;
    }
    out.push_back({id::K_LTE_CA_STATUS, status.data()});
    out.push_back({id::K_LTE_SECONDARYCELL_MEAS, secondary.data()});
    out.push_back({id::K_LTE_COMPCARR_INFO, components.data()});
}

// Serving cell measurement response: sub-packets 0x19, each the EARFCN of one carrier and
// its cells: the serving cell of that carrier (is-serving set, with its serving-cell index)
// and cells of the same frequency that do not serve, which are left to the neighbour
// measurements. The primary cell (index 0) gives the RSRP/RSRQ/SINR sample; every serving
// cell is remembered for the carrier aggregation screens.
bool servingCellMeasResponse(const LogPacket& packet, DecodeState& state,
                             std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    if (r.size() < 4) return false;
    std::vector<MeasuredCarrier> measured;
    std::size_t at = 4;
    for (std::size_t i = 0, n = r.u8(1); i < n; ++i) {
        if (!r.fits(at, 4)) return false;
        const std::size_t size = r.u16(at + 2);
        if (size < 4 || !r.fits(at, size)) return false;
        if (r.u8(at) != kServingCellMeasId) return false;
        const ScmrLayout* layout = scmrLayout(r.u8(at + 1));
        if (layout == nullptr) return false;
        auto carrier = measuredCarrier(Reader(r.bytes(at + 4, size - 4)), *layout);
        if (!carrier) return false;
        measured.push_back(std::move(*carrier));
        at += size;
    }
    if (measured.empty()) return false;

    auto& carriers = state.lte.connected.carriers;
    for (const MeasuredCarrier& carrier : measured) {
        for (const MeasuredCell& cell : carrier.cells) {
            if (!cell.serving) continue;
            if (cell.index == 0) out.push_back(primaryCellMeasurement(cell, packet.timeMs));
            LteServingCarrier c;
            c.index = cell.index;
            c.earfcn = carrier.earfcn;
            c.pci = cell.pci;
            c.rsrpCentiDb = rsrpCentiDb(cell.rsrp);
            c.rsrqCentiDb = rsrqCentiDb(cell.rsrq);
            c.rssiCentiDb = rssiCentiDb(cell.rssi);
            if (const auto snr = std::max(cell.snrRx[0], cell.snrRx[1])) c.snrDb = snrDb(*snr);
            c.measuredMs = packet.timeMs;
            remember(carriers, c);
        }
    }
    std::erase_if(carriers, [&](const auto& c) { return !fresh(c.measuredMs, packet.timeMs); });
    writeCarriers(carriers, packet.timeMs, out);
    return true;
}

// ---- 0xB195 connected-mode neighbour measurements ---------------------------------------

constexpr std::uint8_t kNeighbourRequestId = 0x1E;
constexpr std::uint8_t kNeighbourResponseId = 0x1F;
constexpr std::uint8_t kNeighbourRequestVersions[] = {3};

// The response: the EARFCN (u16 in v3, u32 in v4), then a u16 with the cell count b0-5, the
// duplex mode b7-8 and the serving-cell index b9-12 whose carrier was measured (v4 pads it to
// 4 bytes); then 52-byte cells: PCI b0-9 of the u32 at 0, RSRP b0-11 of the u16 at 12, RSRQ
// b10-19 of the u32 at 20 (MobileInsight's tables; v24, which it marks unverified, is refused).
struct NeighbourLayout {
    std::uint8_t version;
    std::size_t header;
    bool wideEarfcn;
};
constexpr NeighbourLayout kNeighbourLayouts[] = {{3, 4, false}, {4, 8, true}};
constexpr std::size_t kNeighbourCellSize = 52;
constexpr Field kNeighbourPci{0, 0, 10};
constexpr Field kNeighbourRsrp{12, 0, 12};
constexpr Field kNeighbourRsrq{20, 10, 10};

static_assert(fieldFits(kNeighbourPci, kNeighbourCellSize) &&
              fieldFits(kNeighbourRsrp, kNeighbourCellSize) &&
              fieldFits(kNeighbourRsrq, kNeighbourCellSize));

std::optional<LteCarrierNeighbours> measuredNeighbours(const Reader& body,
                                                       const NeighbourLayout& layout) {
    if (!body.fits(0, layout.header)) return std::nullopt;
    const std::size_t wordAt = layout.wideEarfcn ? 4 : 2;
    const std::uint32_t word = body.u16(wordAt);
    const std::size_t count = word & 0x3F;
    if (!cellsFit(body, layout.header, count, kNeighbourCellSize)) return std::nullopt;
    LteCarrierNeighbours list;
    list.earfcn = layout.wideEarfcn ? body.u32(0) : body.u16(0);
    list.servingIndex = word >> 9 & 0xF;
    for (std::size_t i = 0; i < count; ++i) {
        const std::size_t at = layout.header + i * kNeighbourCellSize;
        LteNeighbourCell cell;
        cell.pci = read(body, at, kNeighbourPci);
        if (cell.pci > 503) return std::nullopt;
        cell.rsrpIndex = rsrpIndex(read(body, at, kNeighbourRsrp));
        cell.rsrqIndex = rsrqIndex(read(body, at, kNeighbourRsrq));
        list.cells.push_back(cell);
    }
    return list;
}

// Connected-mode neighbour measurements: a request (0x1E, not read) and a response (0x1F)
// with the neighbours of one serving carrier. The lists of every serving carrier measured in
// the last moments are written together.
bool connectedNeighbourMeas(const LogPacket& packet, DecodeState& state,
                            std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    if (r.size() < 4) return false;
    std::vector<LteCarrierNeighbours> measured;
    std::size_t at = 4;
    for (std::size_t i = 0, n = r.u8(1); i < n; ++i) {
        if (!r.fits(at, 4)) return false;
        const std::uint8_t subId = r.u8(at);
        const std::uint8_t version = r.u8(at + 1);
        const std::size_t size = r.u16(at + 2);
        if (size < 4 || !r.fits(at, size)) return false;
        if (subId == kNeighbourRequestId) {
            if (std::find(std::begin(kNeighbourRequestVersions),
                          std::end(kNeighbourRequestVersions),
                          version) == std::end(kNeighbourRequestVersions))
                return false;
        } else if (subId == kNeighbourResponseId) {
            const auto layout =
                std::find_if(std::begin(kNeighbourLayouts), std::end(kNeighbourLayouts),
                             [&](const auto& l) { return l.version == version; });
            if (layout == std::end(kNeighbourLayouts)) return false;
            auto list = measuredNeighbours(Reader(r.bytes(at + 4, size - 4)), *layout);
            if (!list) return false;
            list->measuredMs = packet.timeMs;
            measured.push_back(std::move(*list));
        } else {
            return false;
        }
        at += size;
    }
    if (measured.empty()) return false;

    auto& lists = state.lte.connected.neighbours;
    for (LteCarrierNeighbours& list : measured) {
        std::erase_if(lists, [&](const auto& l) { return l.servingIndex == list.servingIndex; });
        lists.push_back(std::move(list));
    }
    std::erase_if(lists, [&](const auto& l) { return !fresh(l.measuredMs, packet.timeMs); });
    std::sort(lists.begin(), lists.end(),
              [](const auto& a, const auto& b) { return a.servingIndex < b.servingIndex; });

    KCellularLteNbrEutraCellMeas m;
    m.setTimestamp(packet.timeMs);
    for (const LteCarrierNeighbours& list : lists) {
        const auto band = modem::lteBandOfEarfcn(list.earfcn);
        for (const LteNeighbourCell& cell : list.cells) {
            auto meas = std::make_shared<EgwErrcNbrEutraMeas>();
            meas->setNbrEarfcn(list.earfcn);
            meas->setNbrPhysCellId(cell.pci);
            if (band) meas->setFreqBandInd(*band);
            meas->setNbrRsrp(cell.rsrpIndex);
            meas->setNbrRsrq(cell.rsrqIndex);
            m.addMeasNbrEutra(std::move(meas));
        }
    }
    out.push_back({id::K_LTE_INTRARAT_MEAS, m.data()});
    return true;
}

constexpr LogDecoderRow kRows[] = {
    {0xB193, 1, "LTE ML1 serving cell measurement response", servingCellMeasResponse},
    {0xB195, 1, "LTE ML1 connected-mode neighbour measurements", connectedNeighbourMeas},
};

}  // namespace

std::span<const LogDecoderRow> lteConnectedDecoders() {
    return kRows;
}

}  // namespace pyx::diag
