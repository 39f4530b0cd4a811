#include <gtest/gtest.h>

#include <set>
#include <string>
#include <thread>
#include <vector>

#include "Payloads.h"
#include "core/Log.h"
#include "core/MainQueue.h"
#include "messages/KBBMetricUtility.h"
#include "metrics/MetricCatalogue.h"
#include "metrics/MetricValidator.h"

namespace pyx {
namespace {

using Property = MetricValidator::DictionaryProperty;

TEST(Catalogue, HoldsThe32KindsInConstantOrderWithTheirConstants) {
    const auto validator = MetricValidator::create(nullptr);
    const auto catalogue = metricCatalogue();
    ASSERT_EQ(catalogue.size(), 32U);
    EXPECT_EQ(catalogue.front().constantName, "K_LTE_CDRX_CONFIG");
    EXPECT_EQ(catalogue.back().constantName, "K_SIM_FILE_INFO");
    std::set<std::int64_t> ids;
    for (const MetricKind& kind : catalogue) {
        EXPECT_EQ((*validator).*(kind.constant), kind.id) << kind.constantName;
        EXPECT_EQ(kind.id >> 16, 0x3C) << kind.constantName;
        ids.insert(kind.id);
    }
    EXPECT_EQ(ids.size(), 32U);
}

TEST(Catalogue, ThirtyKindsDecodeEachIntoItsOwnProperty) {
    std::set<Property> properties;
    int decodable = 0;
    for (const MetricKind& kind : metricCatalogue()) {
        if (!kind.decodable()) continue;
        ++decodable;
        ASSERT_TRUE(kind.property) << kind.constantName;
        EXPECT_FALSE(kind.messageClass.empty());
        EXPECT_FALSE(kind.logPrefix.empty());
        properties.insert(*kind.property);
    }
    EXPECT_EQ(decodable, 30);
    EXPECT_EQ(properties.size(), 30U);
    EXPECT_EQ(properties.count(Property::myLTESCellMeasDict), 0U);
}

TEST(Catalogue, RlfAndScellMeasAreCataloguedButNotDecoded) {
    const MetricKind* rlf = findMetricKind(3952165);
    const MetricKind* scellMeas = findMetricKind(3986177);
    ASSERT_NE(rlf, nullptr);
    ASSERT_NE(scellMeas, nullptr);
    EXPECT_FALSE(rlf->decodable());
    EXPECT_FALSE(scellMeas->decodable());
    EXPECT_EQ(findMetricKind(0), nullptr);
}

TEST(Catalogue, LogPrefixesAreKeptExactly) {
    EXPECT_EQ(findMetricKind(3943948)->logPrefix, "Received GSM Serving Cell Info ");
    EXPECT_EQ(findMetricKind(3952490)->logPrefix, "Received RSRP RSRQ SINR is : ");
    EXPECT_EQ(findMetricKind(3986697)->logPrefix, "Received MM Common Info Dict is : ");
    EXPECT_EQ(findMetricKind(3985667)->logPrefix, "Received Tx Power is ");
}

TEST(Store, BeforeAnyMetricEveryDictionaryPropertyIsAbsent) {
    const auto validator = MetricValidator::create(nullptr);
    for (std::size_t i = 0; i < MetricValidator::kDictionaryPropertyCount; ++i) {
        EXPECT_FALSE(validator->dictionary(static_cast<Property>(i)))
            << MetricValidator::nameOf(static_cast<Property>(i));
    }
    EXPECT_FALSE(validator->myLTERRCStateDict());
    EXPECT_FALSE(validator->mySIMFileInfoDict());
    EXPECT_FALSE(validator->metricID());
    EXPECT_EQ(validator->myLTE(), LTEListHolder{});
    EXPECT_EQ(validator->myUMTS(), UMTSListHolder{});
    EXPECT_EQ(validator->myGSM(), GSMListHolder{});
    EXPECT_EQ(validator->myCommon(), CommonListHolder{});
}

TEST(Store, Has31PropertiesInTheirDeclarationOrder) {
    ASSERT_EQ(MetricValidator::kDictionaryPropertyCount, 31U);
    const std::vector<std::string> expected = {"myLTERRCStateDict",
                                               "myLTECDRXConfigDict",
                                               "myLTESCellInfoDict",
                                               "myLTESCellMeasDict",
                                               "myLTESelReselDict",
                                               "myLTERsrpRsrqSinrDict",
                                               "myLTECompCarrDict",
                                               "myLTETxPowerDict",
                                               "myLTEInterRatMeasDict",
                                               "myLTEIntraRatMeasDict",
                                               "myLTECAStatusDict",
                                               "myLTESecondaryCellMeasDict",
                                               "myLTEEMMContextDict",
                                               "myCellularMMCommonInfoDict",
                                               "myCellularActiveBearerDict",
                                               "myGMMContextDict",
                                               "myMMContextDict",
                                               "myUMTSRRCStateDict",
                                               "myUMTSRRCConfigDict",
                                               "myUMTSCellInfoDict",
                                               "myUMTSCellMeasDict",
                                               "myUMTSTxPowerDict",
                                               "myUMTSSelReselDict",
                                               "myUMTSNbrMeasDict",
                                               "myGSMScellInfoDict",
                                               "myGSMIdleConfigInfoDict",
                                               "myGSMIdleScellMeasDict",
                                               "myGSMConnRfMeasDict",
                                               "myGSMNbrMeasDict",
                                               "myGSMGPRSConfigDict",
                                               "mySIMFileInfoDict"};
    std::vector<std::string> names;
    for (std::size_t i = 0; i < MetricValidator::kDictionaryPropertyCount; ++i) {
        names.emplace_back(MetricValidator::nameOf(static_cast<Property>(i)));
    }
    EXPECT_EQ(names, expected);
}

TEST(Catalogue, EveryPropertyButTheIgnoredOnesBelongsToADecodedKind) {
    std::set<std::string_view> decodedInto;
    for (const MetricKind& kind : metricCatalogue()) {
        if (kind.decodable()) decodedInto.insert(MetricValidator::nameOf(*kind.property));
    }
    std::set<std::string_view> neverWritten;
    for (std::size_t i = 0; i < MetricValidator::kDictionaryPropertyCount; ++i) {
        const auto name = MetricValidator::nameOf(static_cast<Property>(i));
        if (decodedInto.count(name) == 0) neverWritten.insert(name);
    }
    EXPECT_EQ(neverWritten, std::set<std::string_view>{"myLTESCellMeasDict"});
    EXPECT_EQ(findMetricKind(3952165)->property, std::nullopt);
    EXPECT_EQ(findMetricKind(3986177)->property, Property::myLTESCellMeasDict);
}

TEST(MetricTag, TableHas31RowsOneForEveryCataloguedKindButTheSecondaryCellMeasurement) {
    ASSERT_EQ(KBBMetricUtility::kEntries.size(), 31U);
    std::set<std::uint16_t> untagged;
    for (const MetricKind& kind : metricCatalogue()) {
        const auto tag = static_cast<std::uint16_t>(kind.id & 0xFFFF);
        if (KBBMetricUtility::classNameForTag(tag).empty()) untagged.insert(tag);
    }
    EXPECT_EQ(untagged, std::set<std::uint16_t>{0xD317});
    EXPECT_EQ(KBBMetricUtility::classNameForTag(0x4E25), "KCellularLteRadioLinkFailure");
    EXPECT_EQ(KBBMetricUtility::classNameForTag(0xD301), "KCellularLteServingCellMeasurement");
}

TEST(Store, DlbwlookupCode3Gives10AndCodes6AndMinus1GiveNothing) {
    const auto validator = MetricValidator::create(nullptr);
    const auto& table = validator->dlbwlookup();
    ASSERT_TRUE(table.count(3));
    EXPECT_EQ(table.at(3), 10.0F);
    EXPECT_EQ(table.count(6), 0U);
    EXPECT_EQ(table.count(-1), 0U);
    EXPECT_EQ(table.size(), 6U);
    EXPECT_EQ(table.at(0), 1.4F);
}

TEST(MetricTag, D302IsAMetricTagAndIsLogged) {
    CapturedLines log(systemLogSink());
    EXPECT_TRUE(KBBMetricUtility::isValidMetricIdTag(std::uint16_t{0xD302},
                                                     KCellularLteTxPower::descriptor()));
    EXPECT_TRUE(log.contains("valid metricId tag"));
}

TEST(MetricTag, SecondaryCellMeasurementTagD317IsNotAMetricTag) {
    CapturedLines log(systemLogSink());
    EXPECT_FALSE(KBBMetricUtility::isValidMetricIdTag(
        std::uint16_t{0xD317}, KCellularLteSecondaryCellMeasurements::descriptor()));
    EXPECT_TRUE(log.lines().empty());
}

TEST(MetricTag, WholeMetricIDIsNotAMetricTag) {
    EXPECT_FALSE(KBBMetricUtility::isValidMetricIdTag(std::int64_t{0x3CD302},
                                                      KCellularLteTxPower::descriptor()));
}

TEST(Store, LteScellMeasDictStaysAbsentAfterItsRecordsArrive) {
    const auto validator = MetricValidator::create(nullptr);
    CapturedLines out(standardOutputSink());
    for (int i = 0; i < 3; ++i) {
        validator->metricsDidUpdate(testing::metricRecord(3986177, testing::lteTxPower()));
    }
    EXPECT_FALSE(validator->myLTESCellMeasDict());
    EXPECT_FALSE(out.contains("Received Valid Metric"));
}

TEST(Store, PropertiesAreReachableByName) {
    for (std::size_t i = 0; i < MetricValidator::kDictionaryPropertyCount; ++i) {
        const auto p = static_cast<Property>(i);
        EXPECT_EQ(MetricValidator::dictionaryPropertyNamed(MetricValidator::nameOf(p)), p);
    }
    EXPECT_EQ(MetricValidator::nameOf(Property::myLTECDRXConfigDict), "myLTECDRXConfigDict");
    EXPECT_EQ(MetricValidator::nameOf(Property::mySIMFileInfoDict), "mySIMFileInfoDict");
    EXPECT_FALSE(MetricValidator::dictionaryPropertyNamed("myLTECDRXConfig"));
    EXPECT_FALSE(MetricValidator::dictionaryPropertyNamed(""));
}

TEST(Store, SetterAndGetterOfAProperty) {
    const auto validator = MetricValidator::create(nullptr);
    const Dict dict{{"state", Value("KLTE_RRC_STATE_IDLE")}};
    validator->setMyLTERRCStateDict(dict);
    EXPECT_EQ(validator->myLTERRCStateDict(), dict);
    EXPECT_EQ(validator->dictionary(Property::myLTERRCStateDict), dict);
    validator->setMyLTERRCStateDict(std::nullopt);
    EXPECT_FALSE(validator->myLTERRCStateDict());
}

TEST(Store, KeyStrings) {
    const auto validator = MetricValidator::create(nullptr);
    EXPECT_EQ(validator->metricIDKey, "kKeyMetricID");
    EXPECT_EQ(validator->payloadKey, "kKeyPayload");
    EXPECT_EQ(validator->profileIDKey, "kKeyProfileID");
    EXPECT_EQ(validator->mySharedVelkInstance(), nullptr);
}

TEST(Store, CreationListensBeforeBecomingTheDelegate) {
    MainQueue mainQueue;
    const auto client = VelkWrapper::create(mainQueue);
    std::vector<std::string> seen;
    // Watches the client's log: when listen reports, the delegate must not be set yet.
    systemLogSink().intercept([&](std::string_view line) {
        seen.push_back(std::string(line) + (client->delegate() ? " [delegate set]" : ""));
    });
    const auto validator = MetricValidator::create(client);
    systemLogSink().intercept({});
    ASSERT_FALSE(seen.empty());
    for (const auto& line : seen) EXPECT_EQ(line.find("[delegate set]"), std::string::npos) << line;
    EXPECT_EQ(client->delegate(), validator);
    EXPECT_EQ(validator->mySharedVelkInstance(), client);
}

TEST(Store, SharedInstanceIsCreatedOnceWithTheSharedClient) {
    std::vector<std::shared_ptr<MetricValidator>> seen(4);
    std::vector<std::thread> callers;
    for (auto& slot : seen)
        callers.emplace_back([&slot] { slot = MetricValidator::sharedInstance(); });
    for (auto& caller : callers) caller.join();
    ASSERT_NE(seen[0], nullptr);
    for (const auto& instance : seen) EXPECT_EQ(instance, seen[0]);
    EXPECT_EQ(seen[0]->mySharedVelkInstance(), VelkWrapper::sharedInstance());
    EXPECT_EQ(VelkWrapper::sharedInstance()->delegate(), seen[0]);
}

}  // namespace
}  // namespace pyx
