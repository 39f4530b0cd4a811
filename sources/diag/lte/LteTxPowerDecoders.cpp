// LTE transmit power (K_LTE_TX_POWER) from the PHY PUSCH Tx report (0xB139), in the versions
// whose power field was checked on the captures: 43 (mi-offline_log_example) and 102
// (mi-latency_sample).
//
// Left out, and counted as not decoded:
// - 0xB139 versions 23, 24 and 26: MobileInsight reads a 10-bit power field there; no capture
//   or vector has one, so neither its sign nor its unit (whole dBm from -40 to +23 need only 7
//   bits, so it may be finer) can be checked. Later versions (122, 124, 144...) have other record
//   layouts and no capture.
// - 0xB16E PUSCH and 0xB16F PUCCH power control: no capture or vector has either, and
//   MobileInsight, the one peer that reads them, takes the PUSCH power unsigned and the PUCCH
//   power signed, which no packet here can settle.
// So no source here fills pucch_tx_power.
#include <cstdint>
#include <memory>

#include "messages/Messages.h"
#include "sources/diag/DecodeState.h"
#include "sources/diag/LogDecoder.h"
#include "sources/diag/decode/ByteReader.h"

namespace pyx::diag {

namespace {

using decode::Reader;
namespace id = decode::id;

constexpr std::size_t kHeader = 8;
constexpr std::size_t kPowerWord = 24;          // in a record
constexpr std::uint32_t kSfnSubframes = 10240;  // 1024 frames of 10 subframes

// The record size of each version read.
struct PuschTxLayout {
    std::uint8_t version;
    std::size_t record;
};
constexpr PuschTxLayout kLayouts[] = {{43, 64}, {102, 68}};

// The PUSCH Tx power, b0-6 of the record's u32 at 24, in dBm (b7 on count the CQI bits).
// The captures hold 12 to 28 (every record of both files); the power rises with the number of
// resource blocks as 10 log10 of it does (mi-latency_sample: 13.7 dBm on average for 1 RB,
// 16.8 for 2, 18.4 for 3, 19.2 for 4, 21.0 for 5), and the power headroom events (1938) of
// mi-offline_log_example, whose first byte read as dB under 23 dBm (their format is not
// documented) gives 15, 20 and 22 dBm, come beside records of 13 to 22 dBm.
// MobileInsight's "x - 128" for version 102 would make that -116 to -100 dBm, and is not
// applied. The field is read as 7-bit two's complement: PUSCH power goes down to -40 dBm
// (TS 36.101), which seven unsigned bits cannot hold, while -64 to +63 holds the whole range;
// no capture has a value with b6 set, so that half of the reading is not checked.
std::int32_t puschTxPower(std::uint32_t word) {
    const auto raw = static_cast<std::int32_t>(word & 0x7F);
    return raw >= 64 ? raw - 128 : raw;
}

// PHY PUSCH Tx report: u8 version, u16 serving cell id (b0-8) and record count (b9-13), one
// byte, u16 dispatch SFN x 10 + subframe, two bytes; then the records, each starting with its
// u16 SFN x 10 + subframe (the captures' values stay under 10240, a few subframes before the
// dispatch). The packet must be exactly as long as its records.
bool puschTxReport(const LogPacket& packet, DecodeState&, std::vector<MetricOut>& out) {
    const Reader r(packet.payload);
    if (r.size() < kHeader) return false;
    const PuschTxLayout* layout = nullptr;
    for (const PuschTxLayout& l : kLayouts)
        if (l.version == r.u8(0)) layout = &l;
    if (layout == nullptr) return false;
    const std::size_t records = (r.u16(1) >> 9) & 0x1F;
    if (r.size() != kHeader + records * layout->record) return false;
    if (r.u16(4) >= kSfnSubframes) return false;

    KCellularLteTxPower m;
    m.setTimestamp(packet.timeMs);
    for (std::size_t i = 0; i < records; ++i) {
        const std::size_t at = kHeader + i * layout->record;
        const std::uint16_t sfnSubframe = r.u16(at);
        if (sfnSubframe >= kSfnSubframes) return false;
        auto info = std::make_shared<TxPowerInfo>();
        info->setPuschTxPower(puschTxPower(r.u32(at + kPowerWord)));
        info->setSubframeIndex(sfnSubframe % 10U);
        m.addTxPowerInfo(std::move(info));
    }
    if (records > 0) out.push_back({id::K_LTE_TX_POWER, m.data()});
    return true;
}

constexpr LogDecoderRow kRows[] = {
    {0xB139, 43, "LTE PHY PUSCH Tx report", puschTxReport},
    {0xB139, 102, "LTE PHY PUSCH Tx report", puschTxReport},
};

}  // namespace

std::span<const LogDecoderRow> lteTxPowerDecoders() {
    return kRows;
}

}  // namespace pyx::diag
