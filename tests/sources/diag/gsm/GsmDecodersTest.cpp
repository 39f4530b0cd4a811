// The GSM decoders against the peers' vectors, byte by byte, and through the store to the
// screens that show them.
#include <gtest/gtest.h>

#include <algorithm>

#include "messages/gsm/GsmEnums.h"
#include "metrics/MetricValidator.h"
#include "sources/diag/decode/ByteReader.h"
#include "sources/diag/gsm/GsmLevels.h"
#include "tests/sources/diag/support/DiagVectors.h"
#include "tests/sources/diag/umts/DecoderHarness.h"
#include "tests/sources/modem/ScreenText.h"

namespace pyx::diag::test {
namespace {

namespace id = decode::id;

constexpr std::uint16_t kBaList = 0x5071;

std::uint16_t codeOf(const Vector& v) {
    return static_cast<std::uint16_t>(std::stoi(v.logCode, nullptr, 16));
}

Decoded decodeVector(const std::string& vectorId, DecodeState& state) {
    const Vector& v = vector(vectorId);
    return decode(gsmDecoders(), codeOf(v), v.bytes, state);
}

// A level shown as RXLEV - 110 dBm holds the peer's power when that power lies in the
// level's 1 dB step (3GPP TS 45.008), or beyond the ends of the scale.
void expectLevelHolds(const Dict& cell, double dbm) {
    const auto rxlev = cell.find("rxlev")->toInt64().value();
    if (rxlev == 0) {
        EXPECT_LT(dbm, -110.0);
    } else if (rxlev == 63) {
        EXPECT_GE(dbm, -48.0);
    } else {
        EXPECT_GE(dbm, static_cast<double>(rxlev - 111));
        EXPECT_LT(dbm, static_cast<double>(rxlev - 110));
    }
}

TEST(GsmLevels, RxLevFollowsTheStepsOfTheStandard) {
    EXPECT_EQ(rxLevOfSixteenths(-111 * 16), 0U);
    EXPECT_EQ(rxLevOfSixteenths(-110 * 16 - 1), 0U);
    EXPECT_EQ(rxLevOfSixteenths(-110 * 16), 1U);
    EXPECT_EQ(rxLevOfSixteenths(-109 * 16 - 1), 1U);
    EXPECT_EQ(rxLevOfSixteenths(-80 * 16), 31U);
    EXPECT_EQ(rxLevOfSixteenths(-49 * 16 + 8), 62U);
    EXPECT_EQ(rxLevOfSixteenths(-48 * 16), 63U);
    EXPECT_EQ(rxLevOfSixteenths(0), 63U);
    EXPECT_EQ(rxLevOfSixteenths(-32768), 0U);
}

TEST(GsmLevels, ABandIsNamedOnlyWhereTheArfcnBelongsToOneBand) {
    EXPECT_EQ(gsmBandOfArfcn(128), SYS_BAND_GSM_850);
    EXPECT_EQ(gsmBandOfArfcn(251), SYS_BAND_GSM_850);
    EXPECT_EQ(gsmBandOfArfcn(850), SYS_BAND_GSM_DCS_1800);
    EXPECT_FALSE(gsmBandOfArfcn(16));   // P-, E- or R-GSM 900
    EXPECT_FALSE(gsmBandOfArfcn(991));  // E- or R-GSM 900
    EXPECT_FALSE(gsmBandOfArfcn(600));  // DCS 1800 or PCS 1900
}

TEST(GsmVectors, CellInformationGivesTheServingCellAsThePeerReadsIt) {
    PYX_NEED_SHARED_DIAG();
    for (const char* vectorId : {"v091", "v092", "v093"}) {
        SCOPED_TRACE(vectorId);
        DecodeState state;
        const Decoded d = decodeVector(vectorId, state);
        ASSERT_TRUE(d.decoded);
        const Dict info = eventOf(d.events, id::K_GSM_SCELL_INFO);
        const auto& e = vector(vectorId).expect;
        EXPECT_EQ(text(info, "arfcn"), std::to_string(e["arfcn"].get<int>()));
        // BSIC = NCC x 8 + BCC, with byte 2 the BCC and byte 3 the NCC as the peer asserts.
        EXPECT_EQ(text(info, "bsic"),
                  std::to_string(e["ncc"].get<int>() * 8 + e["bcc"].get<int>()));
        EXPECT_EQ(text(info, "mcc"), e["mcc"].get<std::string>());
        EXPECT_EQ(text(info, "mnc"), std::to_string(std::stoi(e["mnc"].get<std::string>())));
        EXPECT_EQ(text(info, "num_mnc_digits"), std::to_string(e["mnc"].get<std::string>().size()));
        EXPECT_EQ(text(info, "lac"), std::to_string(e["lac"].get<int>()));
        EXPECT_EQ(text(info, "cell_id"), std::to_string(e["cell_id"].get<int>()));
        EXPECT_FALSE(info.contains("gsm_band"));  // 900 MHz numbers: shared by three bands
        EXPECT_FALSE(info.contains("state"));
        EXPECT_EQ(state.gsm.servingArfcn, e["arfcn"].get<int>());
    }
}

TEST(GsmVectors, ServingAuxMeasurementGivesTheServingLevelInDbm) {
    PYX_NEED_SHARED_DIAG();
    DecodeState state;
    ASSERT_TRUE(decodeVector("v091", state).decoded);
    const Decoded d = decodeVector("v083", state);
    ASSERT_TRUE(d.decoded);
    const Dict meas = eventOf(d.events, id::K_GSM_IDLE_SCELL_MEAS);
    EXPECT_NEAR(static_cast<double>(meas.find("idle_rxlev_dBm")->toInt64().value()),
                vector("v083").expect["rx_power_dbm"].get<double>(), 0.5);
    EXPECT_EQ(text(meas, "scell_arfcn"), "16");  // the cell v091 named
}

TEST(GsmVectors, NeighbourAuxMeasurementsGiveEachCarriersLevel) {
    PYX_NEED_SHARED_DIAG();
    for (const char* vectorId : {"v085", "v086"}) {
        SCOPED_TRACE(vectorId);
        DecodeState state;
        const Decoded d = decodeVector(vectorId, state);
        ASSERT_TRUE(d.decoded);
        const Dict meas = eventOf(d.events, id::K_GSM_NCELL_MEAS);
        const auto& cells = vector(vectorId).expect["cells"];
        ASSERT_EQ(lengthOf(meas, "gsm_ncell_meas"), cells.size());
        for (std::size_t i = 0; i < cells.size(); ++i) {
            const Dict& cell = element(meas, "gsm_ncell_meas", i);
            EXPECT_EQ(text(cell, "arfcn"), std::to_string(cells[i]["arfcn"].get<int>()));
            expectLevelHolds(cell, cells[i]["rx_power_dbm"].get<double>());
            EXPECT_FALSE(cell.contains("bsic"));
        }
    }
}

TEST(GsmVectors, BaListGivesItsCarriersWithTheLevelsLastMeasured) {
    PYX_NEED_SHARED_DIAG();
    DecodeState state;
    // v084 alone: ten carriers, no BSIC decoded and nothing measured yet.
    Decoded d = decodeVector("v084", state);
    ASSERT_TRUE(d.decoded);
    Dict meas = eventOf(d.events, id::K_GSM_NCELL_MEAS);
    const auto& cells = vector("v084").expect["cells"];
    ASSERT_EQ(lengthOf(meas, "gsm_ncell_meas"), cells.size());
    for (std::size_t i = 0; i < cells.size(); ++i) {
        const Dict& cell = element(meas, "gsm_ncell_meas", i);
        EXPECT_EQ(text(cell, "arfcn"), std::to_string(cells[i]["arfcn"].get<int>()));
        EXPECT_FALSE(cell.contains("bsic"));
        EXPECT_FALSE(cell.contains("rxlev"));
    }
    // After v086 measured carriers 10, 12 and 16, the list shows their levels.
    ASSERT_TRUE(decodeVector("v086", state).decoded);
    d = decodeVector("v084", state);
    meas = eventOf(d.events, id::K_GSM_NCELL_MEAS);
    EXPECT_EQ(text(element(meas, "gsm_ncell_meas", 1), "rxlev"), "0");   // ARFCN 10: -112.06
    EXPECT_EQ(text(element(meas, "gsm_ncell_meas", 2), "rxlev"), "0");   // ARFCN 12: -110.44
    EXPECT_FALSE(element(meas, "gsm_ncell_meas", 0).contains("rxlev"));  // ARFCN 4
}

TEST(GsmDecoders, ACarrierWithItsBsicDecodedShowsItAndItsLevel) {
    // Two carriers: ARFCN 60 with BSIC 45 (NCC 5, BCC 5) at -70.125 dBm, ARFCN 62 not decoded.
    const Bytes baList{0x02, 0x3C, 0x80, 0x9E, 0xFB, 0x01, 0x2D, 0, 0, 0, 0, 0, 0,
                       0x3E, 0x80, 0x00, 0x00, 0x00, 0x00, 0,    0, 0, 0, 0, 0};
    DecodeState state;
    Decoded d = decode(gsmDecoders(), kBaList, baList, state);
    ASSERT_TRUE(d.decoded);
    Dict meas = eventOf(d.events, id::K_GSM_NCELL_MEAS);
    ASSERT_EQ(lengthOf(meas, "gsm_ncell_meas"), 2U);
    EXPECT_EQ(text(element(meas, "gsm_ncell_meas", 0), "bsic"), "45");
    EXPECT_EQ(text(element(meas, "gsm_ncell_meas", 0), "rxlev"), "40");  // -70.125 dBm
    EXPECT_FALSE(element(meas, "gsm_ncell_meas", 1).contains("bsic"));
    // The neighbour measurements then name carrier 60's BSIC.
    const Bytes aux{0x01, 0x3C, 0x80, 0x60, 0xFB};  // ARFCN 60 at -74 dBm
    d = decode(gsmDecoders(), 0x507B, aux, state);
    ASSERT_TRUE(d.decoded);
    meas = eventOf(d.events, id::K_GSM_NCELL_MEAS);
    EXPECT_EQ(text(element(meas, "gsm_ncell_meas", 0), "bsic"), "45");
    EXPECT_EQ(text(element(meas, "gsm_ncell_meas", 0), "rxlev"), "37");
}

// The vectors of the GSM range that no row of ours takes, and why.
struct Unused {
    const char* id;
    const char* why;
};
constexpr Unused kUnusedVectors[] = {
    {"v079", "0x5065 FCCH acquisition: a search step, no screen shows it"},
    {"v080",
     "0x5066 SCH acquisition: a search step (its BSIC is the serving cell's, which "
     "0x5134 gives)"},
    {"v081",
     "0x506C burst metrics: per-burst power of the serving carrier, which 0x507A "
     "gives as the screen shows it"},
    {"v082", "0x506A new burst metrics: as 0x506C"},
    {"v087", "0x512F RR signalling (BCCH): needs a GSM RR message decoder; counted, not decoded"},
    {"v088", "0x512F RR signalling (CCCH): needs a GSM RR message decoder; counted, not decoded"},
    {"v089", "0x512F RR signalling (CCCH): needs a GSM RR message decoder; counted, not decoded"},
    {"v090", "0x512F RR signalling (BCCH): needs a GSM RR message decoder; counted, not decoded"},
};
constexpr const char* kUsedVectors[] = {"v083", "v084", "v085", "v086", "v091", "v092", "v093"};

TEST(GsmVectors, EveryGsmVectorIsUsedOrSaysWhyNot) {
    PYX_NEED_SHARED_DIAG();
    for (const Unused& unused : kUnusedVectors) {
        const Vector& v = vector(unused.id);
        EXPECT_EQ(rowFor(gsmDecoders(), codeOf(v), v.bytes), nullptr)
            << unused.id << ": " << unused.why;
    }
    for (const char* used : kUsedVectors) {
        const Vector& v = vector(used);
        EXPECT_NE(rowFor(gsmDecoders(), codeOf(v), v.bytes), nullptr) << used;
    }
    for (const Vector& v : vectors()) {
        if (v.kind != "log" || v.logCode.size() != 6 || v.logCode[2] != '5') continue;
        const auto is = [&](const char* vectorId) { return v.id == vectorId; };
        const bool listed = std::any_of(std::begin(kUnusedVectors), std::end(kUnusedVectors),
                                        [&](const Unused& u) { return is(u.id); });
        const bool used = std::any_of(std::begin(kUsedVectors), std::end(kUsedVectors), is);
        EXPECT_TRUE(listed != used) << v.id << " " << v.logCode;
    }
}

TEST(GsmDecoders, EveryPrefixOfAPacketIsRefusedUntilItIsWhole) {
    PYX_NEED_SHARED_DIAG();
    for (const char* vectorId : kUsedVectors) {
        const Vector& v = vector(vectorId);
        for (std::size_t n = 0; n < v.bytes.size(); ++n) {
            const Bytes prefix(v.bytes.begin(), v.bytes.begin() + static_cast<std::ptrdiff_t>(n));
            DecodeState state;
            EXPECT_FALSE(decode(gsmDecoders(), codeOf(v), prefix, state).decoded)
                << vectorId << " cut to " << n;
            EXPECT_FALSE(state.gsm.servingArfcn);
            EXPECT_TRUE(state.gsm.baList.empty());
            EXPECT_TRUE(state.gsm.measured.empty());
        }
    }
}

TEST(GsmScreens, ServingCellAndNeighboursShowTheVectorsValues) {
    PYX_NEED_SHARED_DIAG();
    const auto store = MetricValidator::create(nullptr);
    DecodeState state;
    for (const char* vectorId : {"v091", "v083", "v085"})
        feed(store, decodeVector(vectorId, state).events);
    const auto shown = [&](const std::string& category, const std::string& key, int section = 0) {
        return pyx::test::shownOn(store, "GSM", category, key, section);
    };
    // The serving cell screens show their first row only: when the values came.
    EXPECT_EQ(shown("Serving Cell Info", "timestamp").value_or("").substr(0, 10), "2020-09-13");
    EXPECT_EQ(shown("Idle Serv Cell Meas", "timestamp").value_or("").substr(0, 10), "2020-09-13");
    ASSERT_TRUE(store->myGSMScellInfoDict());
    const Dict& info = *store->myGSMScellInfoDict();
    EXPECT_EQ(text(info, "arfcn"), "16");
    EXPECT_EQ(text(info, "bsic"), "12");
    EXPECT_EQ(text(info, "lac"), "321");
    EXPECT_EQ(text(info, "cell_id"), "30232");
    ASSERT_TRUE(store->myGSMIdleScellMeasDict());
    EXPECT_EQ(text(*store->myGSMIdleScellMeasDict(), "idle_rxlev_dBm"), "-77");
    ASSERT_EQ(pyx::test::sectionsOn(store, "GSM", "GSM Neighbor Cell Meas"), 6);
    EXPECT_EQ(shown("GSM Neighbor Cell Meas", "arfcn", 0), "42");
    EXPECT_EQ(shown("GSM Neighbor Cell Meas", "rxlev", 0), "-105");  // -105.25 dBm: RXLEV 5
    EXPECT_EQ(shown("GSM Neighbor Cell Meas", "arfcn", 5), "12");
    EXPECT_EQ(shown("GSM Neighbor Cell Meas", "rxlev", 5), "-110");  // -114.25 dBm: RXLEV 0
}

TEST(GsmDecoders, NoisePayloadsNeverReadPastTheirEndAndWhatIsWrittenDecodes) {
    EXPECT_GT(feedNoise(gsmDecoders()), 0U);
}

}  // namespace
}  // namespace pyx::diag::test
