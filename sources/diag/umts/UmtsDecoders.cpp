// WCDMA log packets: the serving cell's identity (0x4127) and the cell reselection ranking of
// the serving cell and its WCDMA and GSM neighbours (0x4005).
#include <algorithm>
#include <memory>

#include "messages/Messages.h"
#include "sources/diag/DecodeState.h"
#include "sources/diag/LogDecoder.h"
#include "sources/diag/decode/ByteReader.h"
#include "sources/diag/gsm/GsmLevels.h"
#include "sources/modem/Bands.h"

namespace pyx::diag {

namespace {

using decode::Reader;
namespace id = decode::id;

// Cell ID: u32 UL UARFCN, u32 DL UARFCN, u32 UTRAN cell id (RNC id b16-27, C-id b0-15),
// u16 URA id, u8 flags, u8 allowed call access, u16 PSC (in b4-12), MCC[3] and MNC[3] one
// digit a byte, u32 LAC, u32 RAC: 32 bytes, no version byte.
bool cellId(const LogPacket& packet, DecodeState& state, std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    if (r.size() < 32) return false;
    const std::uint32_t dlUarfcn = r.u32(4);
    const std::uint32_t psc = r.u16(16) >> 4;

    KCellularWcdmaCellInfo m;
    m.setTimestamp(packet.timeMs);
    m.setDlUarfcn(dlUarfcn);
    m.setPsc(psc);
    m.setCellId(r.u32(8));
    if (const auto plmn = decode::digitPlmn(r.bytes(18, 6).first<6>())) {
        m.setMcc(plmn->mcc);
        m.setMnc(plmn->mnc);
        m.setNumMncDigits(plmn->mncDigits);
    }
    m.setLac(r.u32(24));
    if (const auto band = modem::umtsBandOfUarfcn(dlUarfcn))
        if (const auto code = modem::wcdmaBandCode(*band))
            m.setWcdmaBand(static_cast<std::int32_t>(*code));
    state.umts.serving = UmtsServingCell{dlUarfcn, psc};
    out.push_back({id::K_UMTS_SCELL_INFO, m.data()});
    return true;
}

// The sizes of one WCDMA and one GSM cell of the reselection ranking, and of its header, by
// the version in b6-7 of its first byte.
struct RankLayout {
    std::size_t header;
    std::size_t wcdmaCell;
    std::size_t gsmCell;
};
constexpr RankLayout kRankLayouts[] = {{2, 10, 7}, {2, 11, 8}, {7, 16, 13}};

// RSCP (dBm) and Ec/Io (half dB) as the serving cell's receive-chain indices hold them:
// RSCP + 116 and (Ec/Io + 24) x 2, neither below 0.
std::uint32_t servingRscpIndex(std::int32_t rscpDbm) {
    return static_cast<std::uint32_t>(std::max(rscpDbm + 116, 0));
}
std::uint32_t servingEcioIndex(std::int32_t ecioHalfDb) {
    return static_cast<std::uint32_t>(std::max(ecioHalfDb + 48, 0));
}
// Ec/Io (half dB) as a neighbour's index holds it: (Ec/Io + 24.5) x 2, from 0 to 49.
std::uint32_t neighbourEcnoIndex(std::int32_t ecioHalfDb) {
    return static_cast<std::uint32_t>(std::clamp(ecioHalfDb + 49, 0, 49));
}

// Search cell reselection ranking: u8 version (b6-7) and WCDMA cell count (b0-5), u8 GSM cell
// count (b0-5), from version 2 five more bytes; then per WCDMA cell u16 UARFCN, u16 PSC,
// i8 RSCP (dBm + 21), i16 RSCP rank, i8 Ec/Io (half dB), i16 Ec/Io rank (version 1 adds the
// reselection status, version 2 also the HCS priority, H value and qualification); per GSM
// cell u16 ARFCN (b0-11), u16 BSIC, i8 RSSI (dBm), i16 rank (plus the same additions). The
// GSM cells' BSIC is left out: no peer shows how it is coded. The serving cell is the WCDMA
// cell the last cell-identity packet named; every other cell is a neighbour.
bool searchCellReselectionRank(const LogPacket& packet, DecodeState& state,
                               std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    if (r.size() < 2) return false;
    const std::size_t version = r.u8(0) >> 6;
    if (version >= std::size(kRankLayouts)) return false;
    const RankLayout& layout = kRankLayouts[version];
    const std::size_t wcdmaCells = r.u8(0) & 0x3F;
    const std::size_t gsmCells = r.u8(1) & 0x3F;
    if (!r.fits(layout.header, wcdmaCells * layout.wcdmaCell + gsmCells * layout.gsmCell))
        return false;

    KCellularWcdmaNbrCellMeas neighbours;
    neighbours.setTimestamp(packet.timeMs);
    std::size_t at = layout.header;
    for (std::size_t i = 0; i < wcdmaCells; ++i, at += layout.wcdmaCell) {
        const std::uint32_t uarfcn = r.u16(at);
        const std::uint32_t psc = r.u16(at + 2);
        const std::int32_t rscpDbm = r.i8(at + 4) - 21;
        const std::int32_t ecioHalfDb = r.i8(at + 7);
        const auto& serving = state.umts.serving;
        if (serving && serving->dlUarfcn == uarfcn && serving->psc == psc) {
            KCellularWcdmaScellMeasurement m;
            m.setTimestamp(packet.timeMs);
            auto rx = std::make_shared<RxInfo>();
            rx->setRsrpRange(servingRscpIndex(rscpDbm));
            rx->setRsrqRange(servingEcioIndex(ecioHalfDb));
            m.addRxInfo(std::move(rx));
            out.push_back({id::K_UMTS_SCELL_MEAS, m.data()});
            continue;
        }
        auto cell = std::make_shared<UtraCellMeasResult>();
        cell->setUarfcn(uarfcn);
        if (const auto band = modem::umtsBandOfUarfcn(uarfcn)) cell->setBand(*band);
        cell->setPsc(psc);
        cell->setRscp(rscpDbm + 116);
        cell->setEcno(neighbourEcnoIndex(ecioHalfDb));
        neighbours.addMeasUtraResult(std::move(cell));
    }
    for (std::size_t i = 0; i < gsmCells; ++i, at += layout.gsmCell) {
        auto cell = std::make_shared<GsmCellMeasResult>();
        cell->setArfcn(r.u16(at) & 0x0FFF);
        cell->setRxlev(rxLevOfSixteenths(r.i8(at + 4) * 16));
        neighbours.addMeasGsmResult(std::move(cell));
    }
    out.push_back({id::K_UMTS_NCELL_MEAS, neighbours.data()});
    return true;
}

constexpr LogDecoderRow kRows[] = {
    {0x4127, kAnyVersion, "WCDMA cell ID", cellId},
    {0x4005, kAnyVersion, "WCDMA search cell reselection rank", searchCellReselectionRank},
};

}  // namespace

std::span<const LogDecoderRow> umtsDecoders() {
    return kRows;
}

}  // namespace pyx::diag
