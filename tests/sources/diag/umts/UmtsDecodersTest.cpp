// The WCDMA decoders against the peers' vectors, byte by byte, and through the store to the
// screens that show them.
#include <gtest/gtest.h>

#include <cmath>

#include "metrics/MetricValidator.h"
#include "sources/diag/decode/ByteReader.h"
#include "tests/sources/diag/support/DiagVectors.h"
#include "tests/sources/diag/umts/DecoderHarness.h"
#include "tests/sources/modem/ScreenText.h"

namespace pyx::diag::test {
namespace {

namespace id = decode::id;

constexpr std::uint16_t kCellId = 0x4127;
constexpr std::uint16_t kRanking = 0x4005;

Decoded decodeVector(const std::string& id, DecodeState& state) {
    const Vector& v = vector(id);
    return decode(umtsDecoders(), static_cast<std::uint16_t>(std::stoi(v.logCode, nullptr, 16)),
                  v.bytes, state);
}

TEST(UmtsVectors, CellIdGivesTheServingCellAsThePeerReadsIt) {
    PYX_NEED_SHARED_DIAG();
    DecodeState state;
    const Decoded d = decodeVector("v076", state);
    ASSERT_TRUE(d.decoded);
    const Dict info = eventOf(d.events, id::K_UMTS_SCELL_INFO);
    const auto& expect = vector("v076").expect;
    EXPECT_EQ(text(info, "dl_uarfcn"), std::to_string(expect["dl_uarfcn"].get<int>()));
    EXPECT_EQ(text(info, "psc"), std::to_string(expect["psc"].get<int>()));
    EXPECT_EQ(text(info, "mcc"), expect["mcc"].get<std::string>());
    EXPECT_EQ(text(info, "mnc"), "3");  // "03": two digits
    EXPECT_EQ(text(info, "num_mnc_digits"), "2");
    EXPECT_EQ(text(info, "lac"), std::to_string(expect["lac"].get<int>()));
    EXPECT_EQ(text(info, "cell_id"), std::to_string(expect["cell_id"].get<int>()));
    EXPECT_EQ(text(info, "wcdma_band"), "SYS_BAND_WCDMA_I_IMT_2000");  // UARFCN 10663
    ASSERT_TRUE(state.umts.serving);
    EXPECT_EQ(state.umts.serving->dlUarfcn, 10663U);
    EXPECT_EQ(state.umts.serving->psc, 397U);
}

// v072 lists two cells of UARFCN 10737 (PSC 50: -95 dBm, -7.5 dB; PSC 49: -98 dBm, -17 dB).
TEST(UmtsVectors, RankingWithoutAKnownServingCellListsEveryCellAsANeighbour) {
    PYX_NEED_SHARED_DIAG();
    DecodeState state;
    const Decoded d = decodeVector("v072", state);
    ASSERT_TRUE(d.decoded);
    EXPECT_EQ(countOf(d.events, id::K_UMTS_SCELL_MEAS), 0U);
    const Dict meas = eventOf(d.events, id::K_UMTS_NCELL_MEAS);
    const auto& expect = vector("v072").expect;
    const double tolerance = vector("v072").tolerance;
    const auto& cells = expect["cells_3g"];
    ASSERT_EQ(lengthOf(meas, "meas_utra_result"), cells.size());
    EXPECT_EQ(lengthOf(meas, "meas_gsm_result"), 0U);
    for (std::size_t i = 0; i < cells.size(); ++i) {
        const Dict& cell = element(meas, "meas_utra_result", i);
        EXPECT_EQ(text(cell, "uarfcn"), std::to_string(cells[i]["uarfcn"].get<int>()));
        EXPECT_EQ(text(cell, "psc"), std::to_string(cells[i]["psc"].get<int>()));
        EXPECT_EQ(text(cell, "band"), "1");
        // As the store shows them: RSCP index - 116 dBm, Ec/No index / 2 - 24.5 dB.
        EXPECT_NEAR(cell.find("rscp")->toInt64().value() - 116, cells[i]["rscp_dbm"].get<double>(),
                    tolerance);
        EXPECT_NEAR(cell.find("ecno")->toInt64().value() * 0.5 - 24.5,
                    cells[i]["ecio_db"].get<double>(), tolerance);
    }
}

TEST(UmtsVectors, RankingGivesTheServingCellsMeasurementOnceItsCellIsKnown) {
    PYX_NEED_SHARED_DIAG();
    DecodeState state;
    state.umts.serving = UmtsServingCell{10737, 50};
    const Decoded d = decodeVector("v072", state);
    ASSERT_TRUE(d.decoded);
    const Dict serving = eventOf(d.events, id::K_UMTS_SCELL_MEAS);
    ASSERT_EQ(lengthOf(serving, "rx_info"), 1U);
    const Dict& rx = element(serving, "rx_info", 0);
    EXPECT_EQ(text(rx, "rsrp_range"), "21");  // -95 dBm + 116
    EXPECT_EQ(text(rx, "rsrq_range"), "33");  // (-7.5 dB + 24) x 2
    EXPECT_FALSE(rx.contains("rssi"));
    const Dict neighbours = eventOf(d.events, id::K_UMTS_NCELL_MEAS);
    ASSERT_EQ(lengthOf(neighbours, "meas_utra_result"), 1U);
    EXPECT_EQ(text(element(neighbours, "meas_utra_result", 0), "psc"), "49");
}

// The vectors of the WCDMA range that no row of ours takes, and why.
struct Unused {
    const char* id;
    const char* why;
};
constexpr Unused kUnusedVectors[] = {
    {"v073", "0x4168 RLC downlink ciphering: no screen shows ciphering"},
    {"v074", "0x4169 RLC uplink ciphering: no screen shows ciphering"},
    {"v075", "0x4169 RLC uplink ciphering: no screen shows ciphering"},
    {"v077", "0x412F RRC signalling (MIB): needs an RRC ASN.1 decoder; counted, not decoded"},
    {"v078", "0x412F RRC signalling (SIB 19): needs an RRC ASN.1 decoder; counted, not decoded"},
};

TEST(UmtsVectors, EveryWcdmaVectorIsUsedOrSaysWhyNot) {
    PYX_NEED_SHARED_DIAG();
    for (const Unused& unused : kUnusedVectors) {
        const Vector& v = vector(unused.id);
        const auto code = static_cast<std::uint16_t>(std::stoi(v.logCode, nullptr, 16));
        EXPECT_EQ(rowFor(umtsDecoders(), code, v.bytes), nullptr)
            << unused.id << ": " << unused.why;
    }
    for (const Vector& v : vectors()) {
        if (v.kind != "log" || v.logCode.size() != 6 || v.logCode[2] != '4') continue;
        const bool listed = std::any_of(std::begin(kUnusedVectors), std::end(kUnusedVectors),
                                        [&](const Unused& u) { return v.id == u.id; });
        const bool used = v.id == "v072" || v.id == "v076";
        EXPECT_TRUE(listed != used) << v.id << " " << v.logCode;
    }
}

TEST(UmtsDecoders, EveryPrefixOfAPacketIsRefusedUntilItIsWhole) {
    PYX_NEED_SHARED_DIAG();
    for (const char* id : {"v076", "v072"}) {
        const Vector& v = vector(id);
        const auto code = static_cast<std::uint16_t>(std::stoi(v.logCode, nullptr, 16));
        for (std::size_t n = 0; n < v.bytes.size(); ++n) {
            const Bytes prefix(v.bytes.begin(), v.bytes.begin() + static_cast<std::ptrdiff_t>(n));
            DecodeState state;
            const Decoded d = decode(umtsDecoders(), code, prefix, state);
            EXPECT_FALSE(d.decoded) << id << " cut to " << n;
            EXPECT_TRUE(d.events.empty() || !d.decoded);
            EXPECT_FALSE(state.umts.serving) << id << " cut to " << n;
        }
    }
}

TEST(UmtsDecoders, ARankingOfAnUnknownVersionIsRefused) {
    const Bytes version3{0xC0, 0x00, 0, 0, 0, 0, 0};
    DecodeState state;
    EXPECT_FALSE(decode(umtsDecoders(), kRanking, version3, state).decoded);
}

TEST(UmtsDecoders, RankingOfVersionZeroAndOneReadsTheirCellSizes) {
    // One WCDMA cell (UARFCN 10700, PSC 12, RSCP raw -80, Ec/Io raw -20) and one GSM cell
    // (ARFCN 60 with band code 8, RSSI -85 dBm) in the version 0 and version 1 sizes.
    const Bytes v0{0x01, 0x01, 0xCC, 0x29, 0x0C, 0x00, 0xB0, 0x00, 0x00, 0xEC,
                   0x00, 0x00, 0x3C, 0x80, 0x00, 0x00, 0xAB, 0x00, 0x00};
    const Bytes v1{0x41, 0x01, 0xCC, 0x29, 0x0C, 0x00, 0xB0, 0x00, 0x00, 0xEC, 0x00,
                   0x00, 0x01, 0x3C, 0x80, 0x00, 0x00, 0xAB, 0x00, 0x00, 0x01};
    for (const Bytes* packet : {&v0, &v1}) {
        DecodeState state;
        const Decoded d = decode(umtsDecoders(), kRanking, *packet, state);
        ASSERT_TRUE(d.decoded);
        const Dict meas = eventOf(d.events, id::K_UMTS_NCELL_MEAS);
        ASSERT_EQ(lengthOf(meas, "meas_utra_result"), 1U);
        const Dict& utra = element(meas, "meas_utra_result", 0);
        EXPECT_EQ(text(utra, "uarfcn"), "10700");
        EXPECT_EQ(text(utra, "rscp"), "15");  // -101 dBm + 116
        EXPECT_EQ(text(utra, "ecno"), "29");  // (-10 dB + 24.5) x 2
        ASSERT_EQ(lengthOf(meas, "meas_gsm_result"), 1U);
        const Dict& gsm = element(meas, "meas_gsm_result", 0);
        EXPECT_EQ(text(gsm, "arfcn"), "60");
        EXPECT_EQ(text(gsm, "rxlev"), "26");  // -85 dBm: RXLEV 26
        // One byte short of the last cell: refused.
        const Bytes cut(packet->begin(), packet->end() - 1);
        EXPECT_FALSE(decode(umtsDecoders(), kRanking, cut, state).decoded);
    }
}

TEST(UmtsScreens, ServingCellInfoAndMeasurementShowTheVectorsValues) {
    PYX_NEED_SHARED_DIAG();
    const auto store = MetricValidator::create(nullptr);
    DecodeState state;
    feed(store, decodeVector("v076", state).events);
    state.umts.serving = UmtsServingCell{10737, 50};
    feed(store, decodeVector("v072", state).events);
    const auto shown = [&](const std::string& category, const std::string& key, int section = 0) {
        return pyx::test::shownOn(store, "UMTS", category, key, section);
    };
    EXPECT_EQ(shown("Serving Cell Info", "dl_uarfcn"), "10663");
    EXPECT_EQ(shown("Serving Cell Info", "psc"), "397");
    EXPECT_EQ(shown("Serving Cell Info", "mcc"), "262");
    EXPECT_EQ(shown("Serving Cell Info", "mnc"), "3");
    EXPECT_EQ(shown("Serving Cell Info", "lac"), "40093");
    EXPECT_EQ(shown("Serving Cell Info", "cell_id"), "137200961");
    EXPECT_EQ(shown("Serving Cell Info", "wcdma_band"), "SYS_BAND_WCDMA_I_IMT_2000");
    EXPECT_EQ(shown("Serving Cell Measurement", "rsrp_range"), "21");
    EXPECT_EQ(shown("UMTS Neighbor Cell Meas", "psc"), "49");
    EXPECT_EQ(shown("UMTS Neighbor Cell Meas", "rscp"), "-98");
    EXPECT_EQ(shown("UMTS Neighbor Cell Meas", "ecno"), "-17.0");
}

TEST(UmtsDecoders, NoisePayloadsNeverReadPastTheirEndAndWhatIsWrittenDecodes) {
    EXPECT_GT(feedNoise(umtsDecoders()), 0U);
}

}  // namespace
}  // namespace pyx::diag::test
