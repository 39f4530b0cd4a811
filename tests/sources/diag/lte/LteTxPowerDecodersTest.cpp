// The LTE Tx power decoder (0xB139 PHY PUSCH Tx report) on packets of the captures checked by
// hand: no peer has a test vector for any Tx-power code (VECTORS.md), so the captures are all
// there is, and through the store to the "LTE Tx Power" screen.
//
// What was checked, by hand and below: mi-offline_log_example (version 43, 9 packets, 11
// records) and mi-latency_sample (version 102, 1169 packets, 1193 records). In both, b0-6 of
// the record's u32 at 24 read 12 to 28 dBm, and the mean power per record rises with its
// number of resource blocks as 10 log10 of it does (latency: 13.7 dBm for 1 RB, 16.8 for 2,
// 18.4 for 3, 19.2 for 4, 21.0 for 5; offline: 13 for 1, 16 and 22 for 2, 20 to 21 for 8 to
// 10). So the field is the power in whole dBm, as MobileInsight names it, without the "x - 128"
// of its version-102 comment (-116 to -100 dBm). No record has b6 set: the negative half of
// the 7-bit two's complement reading is not checked by any capture.
#include <gtest/gtest.h>

#include <cmath>
#include <iomanip>
#include <map>
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

constexpr std::uint16_t kPuschTx = 0xB139;

std::string hexOf(std::span<const std::uint8_t> bytes) {
    std::ostringstream out;
    for (const std::uint8_t b : bytes) out << std::hex << std::setw(2) << std::setfill('0') << +b;
    return out.str();
}

// The index-th 0xB139 payload of a capture, checked to be the bytes read by hand.
Bytes capturedReport(const std::string& file, std::size_t index, const std::string& hex) {
    const auto payloads = capturePayloads(file, kPuschTx);
    if (index >= payloads.size()) {
        ADD_FAILURE() << file << " has " << payloads.size() << " PUSCH Tx reports";
        return {};
    }
    EXPECT_EQ(hexOf(payloads[index]), hex) << file << " packet " << index;
    return payloads[index];
}

// The (subframe, PUSCH power) of each record a packet writes; empty when it is refused.
using Powers = std::vector<std::pair<std::string, std::string>>;
Powers powersOf(const Bytes& payload) {
    DecodeState state;
    const Decoded d = decode(lteTxPowerDecoders(), kPuschTx, payload, state);
    if (!d.decoded || d.events.empty()) return {};
    const Dict m = eventOf(d.events, id::K_LTE_TX_POWER);
    EXPECT_EQ(text(m, "timestamp"), std::to_string(kTimeMs));
    Powers out;
    for (std::size_t i = 0; i < lengthOf(m, "tx_power_info"); ++i) {
        const Dict& info = element(m, "tx_power_info", i);
        EXPECT_FALSE(info.contains("pucch_tx_power"));
        out.emplace_back(text(info, "subframe_index"), text(info, "pusch_tx_power"));
    }
    return out;
}

// offline_log_example, version 43 (records of 64 bytes from byte 8):
//  1: one record (2b 95 03: serving cell 405, 1 record), SFN x 10 + subframe 0x1672 = 5746,
//     1 RB (b25-31 of the u32 at 8: 0x02bd7807 >> 25), power word 0x0000000d: 13 dBm;
//  2: two records (95 05: 2), 5754 with 2 RBs and 0x10: 16 dBm, 5766 with 3 RBs and
//     0x00580b11: 17 dBm (b7 on hold the CQI bits: 22 of them).
TEST(LteTxPowerCaptures, Version43ReadsThePowerOfEachRecord) {
    PYX_NEED_SHARED_DIAG();
    const std::string file = "mi-offline_log_example.mi2log";
    const Bytes one = capturedReport(
        file, 1,
        "2b950300781600007216380300f434000778bd02370000000000000000001b000d0000000000000000000000"
        "00000000000000000000000000000000000000000000000000000000");
    EXPECT_EQ(powersOf(one), (Powers{{"6", "13"}}));
    const auto payloads = capturePayloads(file, kPuschTx);
    ASSERT_GT(payloads.size(), 2U);
    const Bytes& two = payloads[2];
    ASSERT_EQ(two.size(), 136U);
    EXPECT_EQ(hexOf(std::span(two).subspan(8, 4)), "7a168e03");   // 5754, ...
    EXPECT_EQ(hexOf(std::span(two).subspan(32, 4)), "10000000");  // 16 dBm
    EXPECT_EQ(hexOf(std::span(two).subspan(72, 4)), "86164102");  // 5766, ...
    EXPECT_EQ(hexOf(std::span(two).subspan(96, 4)), "110b5800");  // 17 dBm, 22 CQI bits
    EXPECT_EQ(powersOf(two), (Powers{{"4", "16"}, {"6", "17"}}));
}

// latency_sample, version 102 (records of 68 bytes from byte 8):
//  2: one record (66 1e 02: serving cell 30, 1 record), 0x15dd = 5597, 3 RBs (b15-21 of the
//     u32 at 4: 0x0001ddba), power word 0x00921e98: b0-6 24 dBm, the rest the CQI bits
//     (61, rate matched to 292), with a CQI payload further on;
//  5: two records, 5674 and 5676, 2 RBs each, 0x14: 20 dBm both.
TEST(LteTxPowerCaptures, Version102ReadsThePowerOfEachRecord) {
    PYX_NEED_SHARED_DIAG();
    const std::string file = "mi-latency_sample.mi2log";
    const Bytes withCqi = capturedReport(
        file, 2,
        "661e0200e3150000dd150400badd01009100550300404000000000100e030000981e9200000000003d3adaff"
        "fcf01a1f000000000000000000000000000000000000000098b44e729a17b800");
    EXPECT_EQ(powersOf(withCqi), (Powers{{"7", "24"}}));
    const Bytes two = capturedReport(
        file, 5,
        "661e0400331600002a160000bc5e01007100380300000000000000000e0300001400000000000000000000"
        "000000000000000000000000000000000000000000000000009ab44e720a0b08002c160000bc5e01006900"
        "000300000000000000000e030000140000000000000000000000000000000000000000000000000000000000"
        "00000000000099b44e7216187800");
    EXPECT_EQ(powersOf(two), (Powers{{"4", "20"}, {"6", "20"}}));
}

// Every record of both captures: a plausible power (the 3GPP range, -40 to +23 dBm for the
// usual power class, 31 for class 1, with the captures' few records over 23), and the mean
// power per RB count rising with the RB count, as a power in dBm does.
TEST(LteTxPowerCaptures, EveryReportDecodesAndItsPowerFollowsTheResourceBlocks) {
    PYX_NEED_SHARED_DIAG();
    struct File {
        const char* name;
        std::size_t packets;
        std::size_t record;
        std::size_t rbWord;
        int rbShift;
    };
    for (const File f : {File{"mi-offline_log_example.mi2log", 9, 64, 8, 25},
                         File{"mi-latency_sample.mi2log", 1169, 68, 4, 15}}) {
        const auto payloads = capturePayloads(f.name, kPuschTx);
        EXPECT_EQ(payloads.size(), f.packets) << f.name;
        std::map<int, std::pair<double, int>> byRbs;  // sum, count
        int lowest = 100, highest = -100;
        for (const Bytes& payload : payloads) {
            const Powers powers = powersOf(payload);
            ASSERT_FALSE(powers.empty()) << f.name << " " << hexOf(payload);
            const decode::Reader r(payload);
            ASSERT_EQ(powers.size(), (r.u16(1) >> 9) & 0x1F);
            for (std::size_t i = 0; i < powers.size(); ++i) {
                const int rbs =
                    static_cast<int>(r.u32(8 + i * f.record + f.rbWord) >> f.rbShift) & 0x7F;
                const int dbm = std::stoi(powers[i].second);
                lowest = std::min(lowest, dbm);
                highest = std::max(highest, dbm);
                byRbs[rbs].first += dbm;
                ++byRbs[rbs].second;
            }
        }
        EXPECT_GE(lowest, 12) << f.name;
        EXPECT_LE(highest, 28) << f.name;
        // The fewest RBs have the least power, the most RBs the most (offline_log_example's
        // 11 records: 13 dBm for 1 RB, 20 and 21 for 8 to 10; between them 2 and 3 RBs read
        // 16 to 22, power control moving the rest). In latency_sample the mean rises with
        // each RB count that has 5 records or more.
        const auto meanOf = [&](int rbs) { return byRbs[rbs].first / byRbs[rbs].second; };
        if (std::string(f.name) == "mi-offline_log_example.mi2log") {
            EXPECT_EQ(byRbs.begin()->first, 1);
            EXPECT_EQ(meanOf(1), lowest);
            for (const int rbs : {8, 9, 10}) EXPECT_GE(meanOf(rbs), 20) << rbs << " RBs";
            continue;
        }
        double previous = -100;
        for (const auto& [rbs, sum] : byRbs) {
            if (sum.second < 5) continue;
            EXPECT_GT(meanOf(rbs), previous) << f.name << " " << rbs << " RBs";
            previous = meanOf(rbs);
        }
    }
    // The latency sample's means against 10 log10(RBs) from 1 RB's: within 1 dB.
    const auto payloads = capturePayloads("mi-latency_sample.mi2log", kPuschTx);
    std::map<int, std::pair<double, int>> byRbs;
    for (const Bytes& payload : payloads) {
        const Powers powers = powersOf(payload);
        const decode::Reader r(payload);
        for (std::size_t i = 0; i < powers.size(); ++i) {
            const int rbs = static_cast<int>(r.u32(8 + i * 68 + 4) >> 15) & 0x7F;
            byRbs[rbs].first += std::stoi(powers[i].second);
            ++byRbs[rbs].second;
        }
    }
    const double oneRb = byRbs[1].first / byRbs[1].second;
    EXPECT_NEAR(oneRb, 13.7, 0.05);
    for (const int rbs : {2, 3, 4, 5})
        EXPECT_NEAR(byRbs[rbs].first / byRbs[rbs].second, oneRb + 10 * std::log10(rbs), 1.0)
            << rbs << " RBs";
}

// ---- Built by hand ----

// A report of version with records of the given size, each with its SFN x 10 + subframe and
// power word.
Bytes report(std::uint8_t version, std::size_t recordSize,
             const std::vector<std::pair<std::uint16_t, std::uint32_t>>& records) {
    Bytes p(8, 0);
    p[0] = version;
    const auto word = static_cast<std::uint16_t>(30 | records.size() << 9);
    p[1] = static_cast<std::uint8_t>(word);
    p[2] = static_cast<std::uint8_t>(word >> 8);
    p[4] = 0x10;  // dispatch 16
    for (const auto& [sfnSubframe, power] : records) {
        Bytes r(recordSize, 0);
        r[0] = static_cast<std::uint8_t>(sfnSubframe);
        r[1] = static_cast<std::uint8_t>(sfnSubframe >> 8);
        for (int b = 0; b < 4; ++b) r[24 + b] = static_cast<std::uint8_t>(power >> (8 * b));
        p.insert(p.end(), r.begin(), r.end());
    }
    return p;
}

TEST(LteTxPowerDecoders, SevenBitsAreReadAsTwosComplement) {
    // 23 dBm; 0x58 = -40 dBm (assumed: see the decoder); 0x40 = -64; 0x3F = 63; b7 on ignored.
    EXPECT_EQ(powersOf(report(102, 68, {{10239, 0x17}})), (Powers{{"9", "23"}}));
    EXPECT_EQ(powersOf(report(102, 68, {{0, 0x58}})), (Powers{{"0", "-40"}}));
    EXPECT_EQ(powersOf(report(43, 64, {{1, 0x40}, {2, 0x3F}, {3, 0xFFFFFF97}})),
              (Powers{{"1", "-64"}, {"2", "63"}, {"3", "23"}}));
}

TEST(LteTxPowerDecoders, OtherVersionsAndMalformedReportsAreRefused) {
    DecodeState state;
    const auto refused = [&](const Bytes& payload) {
        return !decode(lteTxPowerDecoders(), kPuschTx, payload, state).decoded;
    };
    // Versions whose power field no capture shows (23, 24, 26: a 10-bit field), and later
    // layouts (122, 124, 144): no row.
    for (const std::uint8_t version : {23, 24, 26, 122, 124, 144, 0, 42, 44, 101, 103}) {
        const Bytes p = report(version, version == 26 ? 52 : 48, {{5, 0x17}});
        EXPECT_EQ(rowFor(lteTxPowerDecoders(), kPuschTx, p), nullptr) << +version;
        EXPECT_TRUE(refused(p)) << +version;
    }
    // A record size that is not its version's; a subframe number past 1023.9.
    EXPECT_TRUE(refused(report(43, 68, {{5, 0x17}})));
    EXPECT_TRUE(refused(report(102, 64, {{5, 0x17}})));
    EXPECT_TRUE(refused(report(102, 68, {{10240, 0x17}})));
    Bytes lateDispatch = report(102, 68, {{5, 0x17}});
    lateDispatch[4] = 0x00;
    lateDispatch[5] = 0x28;  // 10240
    EXPECT_TRUE(refused(lateDispatch));
    // No record: taken, nothing written (the screen keeps the last powers).
    const Decoded none = decode(lteTxPowerDecoders(), kPuschTx, report(102, 68, {}), state);
    EXPECT_TRUE(none.decoded);
    EXPECT_TRUE(none.events.empty());
    // 0xB16E, 0xB16F (power control) and 0xB13C (PUCCH Tx report): no row.
    for (const std::uint16_t code : {0xB16E, 0xB16F, 0xB13C}) {
        const Bytes p{4, 0, 0, 1, 0, 0, 0, 0};
        EXPECT_EQ(rowFor(lteTxPowerDecoders(), code, p), nullptr) << code;
    }
}

TEST(LteTxPowerDecoders, EveryPrefixOfAReportIsRefused) {
    PYX_NEED_SHARED_DIAG();
    std::vector<Bytes> packets;
    for (const std::size_t i : {1U, 2U})
        packets.push_back(capturePayloads("mi-offline_log_example.mi2log", kPuschTx).at(i));
    for (const std::size_t i : {2U, 5U})
        packets.push_back(capturePayloads("mi-latency_sample.mi2log", kPuschTx).at(i));
    for (const Bytes& whole : packets) {
        for (std::size_t n = 0; n < whole.size(); ++n) {
            const Bytes prefix(whole.begin(), whole.begin() + static_cast<std::ptrdiff_t>(n));
            DecodeState state;
            const Decoded d = decode(lteTxPowerDecoders(), kPuschTx, prefix, state);
            EXPECT_FALSE(d.decoded) << hexOf(whole) << " cut to " << n;
        }
        Bytes longer = whole;
        longer.push_back(0);
        DecodeState state;
        EXPECT_FALSE(decode(lteTxPowerDecoders(), kPuschTx, longer, state).decoded);
    }
}

TEST(LteTxPowerScreens, TheTxPowerScreenShowsEachRecordsPowerAndSubframe) {
    PYX_NEED_SHARED_DIAG();
    const auto store = MetricValidator::create(nullptr);
    DecodeState state;
    const auto payloads = capturePayloads("mi-latency_sample.mi2log", kPuschTx);
    ASSERT_GT(payloads.size(), 5U);
    feed(store, decode(lteTxPowerDecoders(), kPuschTx, payloads[2], state).events);
    ASSERT_EQ(pyx::test::sectionsOn(store, "LTE", "Tx Power"), 1);
    EXPECT_EQ(pyx::test::shownOn(store, "LTE", "Tx Power", "pusch_tx_power"), "24");
    // The next report replaces the list: two records now.
    feed(store, decode(lteTxPowerDecoders(), kPuschTx, payloads[5], state).events);
    ASSERT_EQ(pyx::test::sectionsOn(store, "LTE", "Tx Power"), 2);
    const auto shown = [&](const std::string& key, int section) {
        return pyx::test::shownOn(store, "LTE", "Tx Power", key, section);
    };
    EXPECT_EQ(shown("pusch_tx_power", 0), "20");
    EXPECT_EQ(shown("subframe_index", 0), "4");
    EXPECT_EQ(shown("pusch_tx_power", 1), "20");
    EXPECT_EQ(shown("subframe_index", 1), "6");
    EXPECT_EQ(shown("pucch_tx_power", 0), std::nullopt);
}

TEST(LteTxPowerDecoders, NoisePayloadsNeverReadPastTheirEndAndWhatIsWrittenDecodes) {
    EXPECT_GT(feedNoise(lteTxPowerDecoders()), 0U);
    // Whole reports of random records: the noise above seldom has the exact length.
    std::uint32_t seed = 777;
    std::size_t written = 0;
    for (const auto& [version, size] : {std::pair{43, std::size_t{64}}, {102, std::size_t{68}}}) {
        for (std::size_t n = 0; n < 32; ++n) {
            std::vector<std::pair<std::uint16_t, std::uint32_t>> records;
            for (std::size_t i = 0; i < n; ++i) {
                seed = seed * 1103515245U + 12345U;
                records.emplace_back(static_cast<std::uint16_t>((seed >> 8) % 10240), seed);
            }
            DecodeState state;
            const Decoded d =
                decode(lteTxPowerDecoders(), kPuschTx,
                       report(static_cast<std::uint8_t>(version), size, records), state);
            EXPECT_TRUE(d.decoded) << n;
            if (d.events.empty()) continue;
            ++written;
            EXPECT_EQ(lengthOf(eventOf(d.events, id::K_LTE_TX_POWER), "tx_power_info"), n);
        }
    }
    EXPECT_EQ(written, 62U);  // every count but 0, in both versions
}

}  // namespace
}  // namespace pyx::diag::test
