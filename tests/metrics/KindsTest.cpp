// Every decoded kind: a record lands in its property, prints its arrival line and, where the
// kind feeds a list holder, refreshes it.
#include <gtest/gtest.h>

#include <cstdio>
#include <map>
#include <ostream>
#include <set>
#include <string>

#include "Payloads.h"
#include "core/Log.h"
#include "metrics/MetricCatalogue.h"

namespace pyx {
namespace {

using testing::payload;
using testing::timestampOnly;

using FedLists = std::map<std::string, std::size_t>;

struct KindCase {
    std::string name;
    std::int64_t id;
    Bytes payload;
    // Every holder list the kind fills, by holder and list name, with its number of entries;
    // every other list of every holder stays empty.
    FedLists fed{};
};

// The lists of all four holders that hold entries, by holder and list name.
FedLists filledLists(const MetricValidator& v) {
    FedLists filled;
    const auto note = [&filled](const char* name, const EntryList& list) {
        if (!list.empty()) filled[name] = list.size();
    };
    const LTEListHolder& lte = v.myLTE();
    note("myLTE.SelReselCellInfo", lte.SelReselCellInfo);
    note("myLTE.EutraNbrs", lte.EutraNbrs);
    note("myLTE.RsrpRsrqSinr", lte.RsrpRsrqSinr);
    note("myLTE.TxPower", lte.TxPower);
    note("myLTE.EutraNbrsMeas", lte.EutraNbrsMeas);
    note("myLTE.UtraNbrsMeas", lte.UtraNbrsMeas);
    note("myLTE.GeraNbrsMeas", lte.GeraNbrsMeas);
    note("myLTE.CAStatusList", lte.CAStatusList);
    note("myLTE.SecondaryCellMeasList", lte.SecondaryCellMeasList);
    const UMTSListHolder& umts = v.myUMTS();
    note("myUMTS.rXInfo", umts.rXInfo);
    note("myUMTS.TxPower", umts.TxPower);
    note("myUMTS.SelReselCellInfo", umts.SelReselCellInfo);
    note("myUMTS.eUtraNbrs", umts.eUtraNbrs);
    note("myUMTS.utraNbrs", umts.utraNbrs);
    note("myUMTS.geraNbrs", umts.geraNbrs);
    note("myUMTS.eUtraNbrMeas", umts.eUtraNbrMeas);
    note("myUMTS.utraNbrMeas", umts.utraNbrMeas);
    note("myUMTS.geraNbrMeas", umts.geraNbrMeas);
    const GSMListHolder& gsm = v.myGSM();
    note("myGSM.eUtraNbrMeas", gsm.eUtraNbrMeas);
    note("myGSM.utraNbrMeas", gsm.utraNbrMeas);
    note("myGSM.geraNbrMeas", gsm.geraNbrMeas);
    const CommonListHolder& common = v.myCommon();
    note("myCommon.MMCommonInfo", common.MMCommonInfo);
    note("myCommon.IMSI", common.IMSI);
    note("myCommon.activeBearer", common.activeBearer);
    note("myCommon.simContents", common.simContents);
    return filled;
}

std::vector<KindCase> kindCases() {
    using namespace testing;
    return {
        {"K_LTE_CDRX_CONFIG", 3952152,
         payload<KCellularLteCdrxConfig>([](auto& m) { m.setOnDurationMs(10); })},
        {"K_LTE_RRC_STATE", 3952132, payload<KCellularLteRrcState>([](auto& m) { m.setState(3); })},
        {"K_LTE_SCELL_INFO", 3948738, lteScellInfo()},
        {"K_LTE_SEL_RESEL_INFO",
         3986190,
         lteSelResel(),
         {{"myLTE.SelReselCellInfo", 1}, {"myLTE.EutraNbrs", 2}}},
        {"K_LTE_TX_POWER", 3986178, lteTxPower(), {{"myLTE.TxPower", 1}}},
        {"K_LTE_RSRP_RSRQ_SINR", 3952490, lteRsrpRsrqSinr(), {{"myLTE.RsrpRsrqSinr", 1}}},
        {"K_LTE_COMPCARR_INFO", 3986187,
         payload<KCellularLteComponentCarrierInfo>([](auto& m) { m.setPccEarfcn(1300); })},
        {"K_LTE_CA_STATUS", 3986195, lteCaStatus(), {{"myLTE.CAStatusList", 1}}},
        {"K_LTE_INTERRAT_MEAS",
         3986192,
         lteInterRatMeas(),
         {{"myLTE.UtraNbrsMeas", 1}, {"myLTE.GeraNbrsMeas", 1}}},
        {"K_LTE_INTRARAT_MEAS", 3986191, lteNbrEutraMeas(97, 34), {{"myLTE.EutraNbrsMeas", 1}}},
        {"K_LTE_SECONDARYCELL_MEAS",
         3986199,
         lteSecondaryCellMeas(),
         {{"myLTE.SecondaryCellMeasList", 1}}},
        {"K_CELLULAR_MM_INFO", 3986697, payload<KCellularMmCommonInfo>([](auto& m) {
             m.setImsi(Bytes{0x29, 0x40});
         })},
        {"K_CELLULAR_ACTIVE_BEARER", 3986701, activeBearers(), {{"myCommon.activeBearer", 2}}},
        {"K_LTE_EMM_CTXT", 3986700, emmContext()},
        {"K_CELLULAR_MM_CTXT", 3986698, payload<KCellularMmContext>([](auto& m) { m.setTmsi(5); })},
        {"K_CELLULAR_GMM_CTXT", 3986699,
         payload<KCellularGmmContext>([](auto& m) { m.setPTmsi(6); })},
        {"K_UMTS_RRC_STATE", 3985682,
         payload<KCellularWcdmaRrcConnectionState>([](auto& m) { m.setState(7); })},
        {"K_UMTS_RRC_CONFIG", 3985683,
         payload<KCellularWcdmaRrcConfiguration>([](auto& m) { m.setIsMimoConfigured(true); })},
        {"K_UMTS_SCELL_INFO", 3944460,
         payload<KCellularWcdmaCellInfo>([](auto& m) { m.setPsc(12); })},
        {"K_UMTS_SCELL_MEAS", 3985666, wcdmaScellMeas(), {{"myUMTS.rXInfo", 1}}},
        {"K_UMTS_TX_POWER", 3985667, wcdmaTxPower(), {{"myUMTS.TxPower", 1}}},
        {"K_UMTS_SEL_RESEL_INFO",
         3985668,
         wcdmaSelResel(),
         {{"myUMTS.SelReselCellInfo", 1},
          {"myUMTS.eUtraNbrs", 1},
          {"myUMTS.utraNbrs", 1},
          {"myUMTS.geraNbrs", 1}}},
        {"K_UMTS_NCELL_MEAS",
         3985669,
         wcdmaNbrMeas(),
         {{"myUMTS.eUtraNbrMeas", 1}, {"myUMTS.utraNbrMeas", 1}, {"myUMTS.geraNbrMeas", 1}}},
        {"K_GSM_SCELL_INFO", 3943948,
         payload<KCellularGsmScellInfo>([](auto& m) { m.setArfcn(20); })},
        {"K_GSM_IDLE_CONFIG", 3985409,
         payload<KCellularGsmIdleConfig>([](auto& m) { m.setAcc(3); })},
        {"K_GSM_IDLE_SCELL_MEAS", 3985410,
         payload<KCellularGsmIdleScellMeasurement>([](auto& m) { m.setIdleRxlevDBm(-80); })},
        {"K_GSM_CS_RF_MEAS", 3985411,
         payload<KCellularGsmCsRfMeasurement>([](auto& m) { m.addCsTxPwr(-3); })},
        {"K_GSM_NCELL_MEAS",
         3985417,
         gsmNbrMeas(),
         {{"myGSM.eUtraNbrMeas", 1}, {"myGSM.utraNbrMeas", 1}, {"myGSM.geraNbrMeas", 1}}},
        {"K_GSM_GPRS_CONFIG", 3985420,
         payload<KCellularGsmGprsConfig>([](auto& m) { m.setRac(4); })},
        {"K_SIM_FILE_INFO", 3932179, simFiles(), {{"myCommon.simContents", 1}}},
    };
}

// The six hex digits of a catalogued ID, as the arrival's first line prints them.
std::string hexText(std::int64_t id) {
    char text[16];
    std::snprintf(text, sizeof text, "%X", static_cast<unsigned>(id));
    return text;
}

// Test names and failure messages show the kind's constant.
void PrintTo(const KindCase& kindCase, std::ostream* os) {
    *os << kindCase.name;
}

class EveryKind : public ::testing::TestWithParam<KindCase> {};

TEST_P(EveryKind, RecordLandsInItsPropertyAndFeedsItsHolder) {
    const KindCase& c = GetParam();
    const MetricKind* kind = findMetricKind(c.id);
    ASSERT_NE(kind, nullptr);
    ASSERT_TRUE(kind->decodable());
    EXPECT_EQ(kind->constantName, c.name);

    const auto validator = MetricValidator::create(nullptr);
    CapturedLines out(standardOutputSink());
    validator->metricsDidUpdate(testing::metricRecord(c.id, c.payload));

    const auto& stored = validator->dictionary(*kind->property);
    ASSERT_TRUE(stored);
    EXPECT_EQ(*stored->find("timestamp"), Value(testing::kTimestampText));
    EXPECT_GE(stored->size(), 2U);
    for (std::size_t i = 0; i < MetricValidator::kDictionaryPropertyCount; ++i) {
        const auto p = static_cast<MetricValidator::DictionaryProperty>(i);
        if (p != *kind->property) {
            EXPECT_FALSE(validator->dictionary(p)) << validator->nameOf(p);
        }
    }
    const auto lines = out.lines();
    ASSERT_EQ(lines.size(), 3U);
    EXPECT_EQ(lines[0], "Metric ID in Hex = " + hexText(c.id));
    EXPECT_EQ(lines[1], std::string(kind->logPrefix) + Value(*stored).description());
    EXPECT_EQ(lines[2], "Received Valid Metric");

    EXPECT_EQ(filledLists(*validator), c.fed);
}

INSTANTIATE_TEST_SUITE_P(Catalogue, EveryKind, ::testing::ValuesIn(kindCases()),
                         [](const ::testing::TestParamInfo<KindCase>& kindCase) {
                             return kindCase.param.name;
                         });

TEST(EveryKindCases, CoverEveryDecodedKindOnce) {
    std::set<std::int64_t> covered;
    for (const auto& c : kindCases()) EXPECT_TRUE(covered.insert(c.id).second) << c.name;
    std::set<std::int64_t> decodable;
    for (const MetricKind& kind : metricCatalogue()) {
        if (kind.decodable()) decodable.insert(kind.id);
    }
    EXPECT_EQ(covered, decodable);
}

}  // namespace
}  // namespace pyx
