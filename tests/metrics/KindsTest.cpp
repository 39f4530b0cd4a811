// Every decoded kind: a record lands in its property, prints its arrival line and, where the
// kind feeds a list holder, refreshes it.
#include <gtest/gtest.h>

#include <functional>
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

struct KindCase {
    std::string name;
    std::int64_t id;
    Bytes payload;
    // The holder list the kind feeds and how many entries it should then hold.
    std::function<const EntryList*(const MetricValidator&)> holderList{};
    std::size_t holderEntries = 0;
};

template <class Holder>
std::function<const EntryList*(const MetricValidator&)> list(
    const Holder& (MetricValidator::*holder)() const, EntryList Holder::*field) {
    return [holder, field](const MetricValidator& v) { return &((v.*holder)().*field); };
}

std::vector<KindCase> kindCases() {
    using namespace testing;
    using V = MetricValidator;
    return {
        {"K_LTE_CDRX_CONFIG", 3952152,
         payload<KCellularLteCdrxConfig>([](auto& m) { m.setOnDurationMs(10); })},
        {"K_LTE_RRC_STATE", 3952132, payload<KCellularLteRrcState>([](auto& m) { m.setState(3); })},
        {"K_LTE_SCELL_INFO", 3948738, lteScellInfo()},
        {"K_LTE_SEL_RESEL_INFO", 3986190, lteSelResel(), list(&V::myLTE, &LTEListHolder::EutraNbrs),
         2},
        {"K_LTE_TX_POWER", 3986178, lteTxPower(), list(&V::myLTE, &LTEListHolder::TxPower), 1},
        {"K_LTE_RSRP_RSRQ_SINR", 3952490, lteRsrpRsrqSinr(),
         list(&V::myLTE, &LTEListHolder::RsrpRsrqSinr), 1},
        {"K_LTE_COMPCARR_INFO", 3986187,
         payload<KCellularLteComponentCarrierInfo>([](auto& m) { m.setPccEarfcn(1300); })},
        {"K_LTE_CA_STATUS", 3986195, lteCaStatus(), list(&V::myLTE, &LTEListHolder::CAStatusList),
         1},
        {"K_LTE_INTERRAT_MEAS", 3986192, lteInterRatMeas(),
         list(&V::myLTE, &LTEListHolder::UtraNbrsMeas), 1},
        {"K_LTE_INTRARAT_MEAS", 3986191, lteNbrEutraMeas(97, 34),
         list(&V::myLTE, &LTEListHolder::EutraNbrsMeas), 1},
        {"K_LTE_SECONDARYCELL_MEAS", 3986199, lteSecondaryCellMeas(),
         list(&V::myLTE, &LTEListHolder::SecondaryCellMeasList), 1},
        {"K_CELLULAR_MM_INFO", 3986697, payload<KCellularMmCommonInfo>([](auto& m) {
             m.setImsi(Bytes{0x29, 0x40});
         })},
        {"K_CELLULAR_ACTIVE_BEARER", 3986701, activeBearers(),
         list(&V::myCommon, &CommonListHolder::activeBearer), 2},
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
        {"K_UMTS_SCELL_MEAS", 3985666, wcdmaScellMeas(), list(&V::myUMTS, &UMTSListHolder::rXInfo),
         1},
        {"K_UMTS_TX_POWER", 3985667, wcdmaTxPower(), list(&V::myUMTS, &UMTSListHolder::TxPower), 1},
        {"K_UMTS_SEL_RESEL_INFO", 3985668, wcdmaSelResel(),
         list(&V::myUMTS, &UMTSListHolder::SelReselCellInfo), 1},
        {"K_UMTS_NCELL_MEAS", 3985669, wcdmaNbrMeas(),
         list(&V::myUMTS, &UMTSListHolder::utraNbrMeas), 1},
        {"K_GSM_SCELL_INFO", 3943948,
         payload<KCellularGsmScellInfo>([](auto& m) { m.setArfcn(20); })},
        {"K_GSM_IDLE_CONFIG", 3985409,
         payload<KCellularGsmIdleConfig>([](auto& m) { m.setAcc(3); })},
        {"K_GSM_IDLE_SCELL_MEAS", 3985410,
         payload<KCellularGsmIdleScellMeasurement>([](auto& m) { m.setIdleRxlevDBm(-80); })},
        {"K_GSM_CS_RF_MEAS", 3985411,
         payload<KCellularGsmCsRfMeasurement>([](auto& m) { m.addCsTxPwr(-3); })},
        {"K_GSM_NCELL_MEAS", 3985417, gsmNbrMeas(), list(&V::myGSM, &GSMListHolder::geraNbrMeas),
         1},
        {"K_GSM_GPRS_CONFIG", 3985420,
         payload<KCellularGsmGprsConfig>([](auto& m) { m.setRac(4); })},
        {"K_SIM_FILE_INFO", 3932179, simFiles(), list(&V::myCommon, &CommonListHolder::simContents),
         1},
    };
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
    EXPECT_EQ(lines[2], "Received Valid Metric");
    EXPECT_EQ(lines[1], std::string(kind->logPrefix) + Value(*stored).description());

    if (c.holderList) {
        EXPECT_EQ(c.holderList(*validator)->size(), c.holderEntries);
    } else {
        EXPECT_EQ(validator->myLTE(), LTEListHolder{});
        EXPECT_EQ(validator->myUMTS(), UMTSListHolder{});
        EXPECT_EQ(validator->myGSM(), GSMListHolder{});
        EXPECT_EQ(validator->myCommon(), CommonListHolder{});
    }
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
