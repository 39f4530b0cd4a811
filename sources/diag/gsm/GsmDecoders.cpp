// GSM log packets: the serving cell's identity (0x5134), its received power (0x507A) and the
// neighbours' (0x507B, with the BCCH allocation of 0x5071). None of them has a version byte.
#include <cmath>
#include <memory>
#include <utility>

#include "messages/Messages.h"
#include "sources/diag/DecodeState.h"
#include "sources/diag/LogDecoder.h"
#include "sources/diag/decode/ByteReader.h"
#include "sources/diag/gsm/GsmLevels.h"

namespace pyx::diag {

namespace {

using decode::Reader;
namespace id = decode::id;

constexpr std::uint16_t kArfcnMask = 0x0FFF;  // b12-15 carry the modem's band code

// A GSM band that holds its ARFCNs alone.
struct ArfcnRange {
    std::uint32_t first;
    std::uint32_t last;
    std::int32_t band;
};
constexpr ArfcnRange kUnsharedArfcns[] = {
    {128, 251, SYS_BAND_GSM_850}, {259, 293, SYS_BAND_GSM_450},      {306, 340, SYS_BAND_GSM_480},
    {438, 511, SYS_BAND_GSM_750}, {811, 885, SYS_BAND_GSM_DCS_1800},
};

// RR cell information: u16 ARFCN (b0-11) and band code, two BSIC bytes, u16 cell id, the
// LAI (BCD PLMN, then the LAC big-endian), cell selection priority, NCC-permitted bitmap.
// The peers disagree on the order of the BSIC bytes; we follow SCAT, whose test asserts
// byte 2 = BCC and byte 3 = NCC (BCC 4, NCC 1 for 04 01), where MobileInsight names them the
// other way round without a test.
bool rrCellInformation(const LogPacket& packet, DecodeState& state, std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    if (r.size() < 13) return false;
    const std::uint16_t arfcn = r.u16(0) & kArfcnMask;
    const std::uint8_t bcc = r.u8(2);
    const std::uint8_t ncc = r.u8(3);

    KCellularGsmScellInfo m;
    m.setTimestamp(packet.timeMs);
    m.setArfcn(arfcn);
    if (bcc < 8 && ncc < 8) m.setBsic(static_cast<std::uint32_t>(ncc) * 8 + bcc);
    m.setCellId(r.u16(4));
    if (const auto plmn = decode::bcdPlmn(r.bytes(6, 3).first<3>())) {
        m.setMcc(plmn->mcc);
        m.setMnc(plmn->mnc);
        m.setNumMncDigits(plmn->mncDigits);
    }
    m.setLac(static_cast<std::uint32_t>(r.u8(9)) << 8 | r.u8(10));
    if (const auto band = gsmBandOfArfcn(arfcn)) m.setGsmBand(*band);
    state.gsm.servingArfcn = arfcn;
    out.push_back({id::K_GSM_SCELL_INFO, m.data()});
    return true;
}

// L1 serving auxiliary measurements: i16 received power in 1/16 dBm, u8 "SNR is bad".
bool servingAuxMeasurements(const LogPacket& packet, DecodeState& state,
                            std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    if (r.size() < 3) return false;
    KCellularGsmIdleScellMeasurement m;
    m.setTimestamp(packet.timeMs);
    if (state.gsm.servingArfcn) m.setScellArfcn(*state.gsm.servingArfcn);
    m.setIdleRxlevDBm(static_cast<std::int32_t>(std::lround(r.i16(0) / 16.0)));
    out.push_back({id::K_GSM_IDLE_SCELL_MEAS, m.data()});
    return true;
}

std::optional<std::uint8_t> bsicOf(const GsmState& gsm, std::uint16_t arfcn) {
    for (const GsmBaCell& cell : gsm.baList)
        if (cell.arfcn == arfcn) return cell.bsic;
    return std::nullopt;
}

std::shared_ptr<GsmNcellMeas> neighbour(std::uint16_t arfcn, std::optional<std::uint8_t> bsic,
                                        std::optional<std::int16_t> rxPower16) {
    auto n = std::make_shared<GsmNcellMeas>();
    n->setArfcn(arfcn);
    if (bsic) n->setBsic(*bsic);
    if (rxPower16) n->setRxlev(rxLevOfSixteenths(*rxPower16));
    return n;
}

// L1 neighbour auxiliary measurements: u8 count, then per cell u16 ARFCN/band, i16 received
// power in 1/16 dBm. The BSIC comes from the BCCH allocation, when the modem has decoded it.
bool neighbourAuxMeasurements(const LogPacket& packet, DecodeState& state,
                              std::vector<MetricOut>& out) {
    constexpr std::size_t kCell = 4;
    const Reader r(packet.payload);
    if (r.size() < 1) return false;
    const std::size_t count = r.u8(0);
    if (!r.fits(1, count * kCell)) return false;
    KCellularGsmGrrEventMeasCr m;
    m.setTimestamp(packet.timeMs);
    std::vector<GsmMeasuredCell> measured;
    measured.reserve(count);
    for (std::size_t i = 0; i < count; ++i) {
        const std::size_t at = 1 + i * kCell;
        const GsmMeasuredCell cell{static_cast<std::uint16_t>(r.u16(at) & kArfcnMask),
                                   r.i16(at + 2)};
        m.addGsmNcellMeas(neighbour(cell.arfcn, bsicOf(state.gsm, cell.arfcn), cell.rxPower16));
        measured.push_back(cell);
    }
    state.gsm.measured = std::move(measured);
    out.push_back({id::K_GSM_NCELL_MEAS, m.data()});
    return true;
}

// Surrounding cells' BCCH allocation: u8 count, then per cell u16 ARFCN/band, i16 received
// power in 1/16 dBm, u8 BSIC known, u8 BSIC (NCC b3-5, BCC b0-2), u32 frame-number offset,
// u16 time offset. A cell whose BSIC is not known has its measurement fields unset (all zero
// in the captures): its level is then the last neighbour measurement of its ARFCN, if any.
bool surroundCellBaList(const LogPacket& packet, DecodeState& state, std::vector<MetricOut>& out) {
    constexpr std::size_t kCell = 12;
    const Reader r(packet.payload);
    if (r.size() < 1) return false;
    const std::size_t count = r.u8(0);
    if (!r.fits(1, count * kCell)) return false;
    KCellularGsmGrrEventMeasCr m;
    m.setTimestamp(packet.timeMs);
    std::vector<GsmBaCell> baList;
    baList.reserve(count);
    for (std::size_t i = 0; i < count; ++i) {
        const std::size_t at = 1 + i * kCell;
        GsmBaCell cell{static_cast<std::uint16_t>(r.u16(at) & kArfcnMask), std::nullopt};
        std::optional<std::int16_t> rxPower16;
        if (r.u8(at + 4) != 0) {
            cell.bsic = static_cast<std::uint8_t>(r.u8(at + 5) & 0x3F);
            rxPower16 = r.i16(at + 2);
        } else {
            for (const GsmMeasuredCell& measured : state.gsm.measured)
                if (measured.arfcn == cell.arfcn) rxPower16 = measured.rxPower16;
        }
        m.addGsmNcellMeas(neighbour(cell.arfcn, cell.bsic, rxPower16));
        baList.push_back(cell);
    }
    state.gsm.baList = std::move(baList);
    out.push_back({id::K_GSM_NCELL_MEAS, m.data()});
    return true;
}

constexpr LogDecoderRow kRows[] = {
    {0x5134, kAnyVersion, "GSM RR cell information", rrCellInformation},
    {0x507A, kAnyVersion, "GSM L1 serving auxiliary measurements", servingAuxMeasurements},
    {0x507B, kAnyVersion, "GSM L1 neighbour auxiliary measurements", neighbourAuxMeasurements},
    {0x5071, kAnyVersion, "GSM surrounding cells' BCCH allocation", surroundCellBaList},
};

}  // namespace

std::optional<std::int32_t> gsmBandOfArfcn(std::uint32_t arfcn) {
    for (const ArfcnRange& range : kUnsharedArfcns)
        if (arfcn >= range.first && arfcn <= range.last) return range.band;
    return std::nullopt;
}

std::span<const LogDecoderRow> gsmDecoders() {
    return kRows;
}

}  // namespace pyx::diag
