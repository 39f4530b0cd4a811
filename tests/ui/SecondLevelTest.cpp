// The category screen: sections, titles, rows and cells of each kind of category, read from
// the store at the moment of each query.
#include <gtest/gtest.h>

#include <string>

#include "StoreFeed.h"
#include "core/Log.h"
#include "ui/ScreenSelectionError.h"
#include "ui/SecondLevelViewController.h"
#include "ui/ThirdLevelViewController.h"

namespace pyx {
namespace {

const Cell kComeBackLater{"Come back later", "Come back later"};
const Cell kAsDequeued{};

class SecondLevel : public ::testing::Test {
  protected:
    std::shared_ptr<MetricValidator> store = test::emptyStore();

    SecondLevelViewController screen(std::string group, std::string category) {
        SecondLevelViewController out(*store);
        out.setFirstSelection(std::move(group));
        out.setSeguedThroughRow(std::move(category));
        return out;
    }

    // Every row of section shows entry number row of expected.
    static void expectEntries(const SecondLevelViewController& s, int section,
                              const Dict& expected) {
        ASSERT_EQ(s.numberOfRowsInSection(section), static_cast<int>(expected.size()));
        for (int row = 0; row < static_cast<int>(expected.size()); ++row) {
            const DictEntry& entry = expected.at(static_cast<std::size_t>(row));
            EXPECT_EQ(s.cellForRowAtIndexPath(section, row),
                      (Cell{entry.key, entry.value.description()}))
                << "section " << section << " row " << row;
        }
    }
};

TEST_F(SecondLevel, CdrxBeforeItsMetricShowsOneUntitledSectionWithOneBlankRow) {
    const auto s = screen("LTE", "C-DRX");
    EXPECT_EQ(s.categoryKey(), "LTE C-DRX");
    EXPECT_EQ(s.numberOfSections(), 1);
    EXPECT_EQ(s.titleForHeaderInSection(0), std::nullopt);
    EXPECT_EQ(s.numberOfRowsInSection(0), 1);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), kAsDequeued);
}

TEST_F(SecondLevel, CdrxAfterItsMetricShowsOneRowPerEntry) {
    const auto s = screen("LTE", "C-DRX");
    test::feedLteCdrx(*store);
    ASSERT_TRUE(store->myLTECDRXConfigDict());
    EXPECT_EQ(s.numberOfSections(), 1);
    EXPECT_EQ(s.titleForHeaderInSection(0), std::nullopt);
    EXPECT_EQ(s.numberOfRowsInSection(0), 3);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), (Cell{"timestamp", "2017-07-14 02:40:00 GMT"}));
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 1), (Cell{"on_duration_ms", "10"}));
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 2), (Cell{"long_drx_cycle_ms", "320"}));
    expectEntries(s, 0, *store->myLTECDRXConfigDict());
}

TEST_F(SecondLevel, EutraNeighborInfoWithThreeNeighboursShowsThreeTitledSections) {
    test::feedLteSelResel(*store, 3);
    const auto s = screen("LTE", "EUTRA Neighbor Info");
    ASSERT_EQ(s.numberOfSections(), 3);
    EXPECT_EQ(s.titleForHeaderInSection(0), "EUTRA Neighbor 0");
    EXPECT_EQ(s.titleForHeaderInSection(1), "EUTRA Neighbor 1");
    EXPECT_EQ(s.titleForHeaderInSection(2), "EUTRA Neighbor 2");
    const EntryList& neighbours = store->myLTE().EutraNbrs;
    ASSERT_EQ(neighbours.size(), 3U);
    for (int section = 0; section < 3; ++section)
        expectEntries(s, section, neighbours[static_cast<std::size_t>(section)]);
    EXPECT_EQ(s.cellForRowAtIndexPath(1, 0), (Cell{"earfcn", "101"}));
}

TEST_F(SecondLevel, EutraNeighborInfoWithAnEmptyListShowsAnEmptyTable) {
    const auto s = screen("LTE", "EUTRA Neighbor Info");
    EXPECT_EQ(s.numberOfSections(), 0);
    test::feedLteSelResel(*store, 0);
    EXPECT_EQ(s.numberOfSections(), 0);
}

TEST_F(SecondLevel, UmtsServingCellMeasShowsTitledSectionsThatComeBackLater) {
    test::feedUmtsScellMeas(*store, 2);
    const auto s = screen("UMTS", "Serving Cell Meas");
    ASSERT_EQ(s.numberOfSections(), 2);
    for (int section = 0; section < 2; ++section) {
        EXPECT_EQ(s.titleForHeaderInSection(section), "RxInfo " + std::to_string(section));
        const int rows = s.numberOfRowsInSection(section);
        EXPECT_EQ(rows, static_cast<int>(
                            store->myUMTS().rXInfo[static_cast<std::size_t>(section)].size()));
        for (int row = 0; row < rows; ++row)
            EXPECT_EQ(s.cellForRowAtIndexPath(section, row), kComeBackLater);
    }
}

TEST_F(SecondLevel, UmtsServingCellMeasurementShowsTheFirstEntryOfTheFirstElement) {
    test::feedUmtsScellMeas(*store, 2);
    SecondLevelViewController s(*store);
    s.setFirstSelection("UMTS");
    s.setSeguedThroughRow("Serving Cell Measurement");
    EXPECT_EQ(s.numberOfSections(), 1);
    EXPECT_EQ(s.titleForHeaderInSection(0), std::nullopt);
    EXPECT_EQ(s.numberOfRowsInSection(0), 1);
    const DictEntry& first = store->myUMTS().rXInfo.at(0).at(0);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), (Cell{first.key, first.value.description()}));
}

TEST_F(SecondLevel, GsmServingCellInfoWithTwelveEntriesShowsOnlyTheFirst) {
    Dict twelve;
    for (int i = 0; i < 12; ++i) twelve.set("field_" + std::to_string(i), Value(i * 10));
    store->setMyGSMScellInfoDict(twelve);
    const auto s = screen("GSM", "Serving Cell Info");
    EXPECT_EQ(s.numberOfSections(), 1);
    EXPECT_EQ(s.numberOfRowsInSection(0), 1);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), (Cell{"field_0", "0"}));
}

TEST_F(SecondLevel, UmtsAndLteActiveBearersShowTheSameSections) {
    test::feedActiveBearers(*store, 2);
    const auto umts = screen("UMTS", "Active Bearers");
    const auto lte = screen("LTE", "Active Bearers");
    const auto gsm = screen("GSM", "Active Bearers");
    ASSERT_EQ(umts.numberOfSections(), 2);
    for (const auto* s : {&lte, &gsm}) {
        ASSERT_EQ(s->numberOfSections(), 2);
        for (int section = 0; section < 2; ++section) {
            EXPECT_EQ(s->titleForHeaderInSection(section), "PDP " + std::to_string(section));
            EXPECT_EQ(s->titleForHeaderInSection(section), umts.titleForHeaderInSection(section));
            ASSERT_EQ(s->numberOfRowsInSection(section), umts.numberOfRowsInSection(section));
            for (int row = 0; row < umts.numberOfRowsInSection(section); ++row)
                EXPECT_EQ(s->cellForRowAtIndexPath(section, row),
                          umts.cellForRowAtIndexPath(section, row));
        }
    }
    expectEntries(umts, 1, store->myCommon().activeBearer.at(1));
}

TEST_F(SecondLevel, GsmConnectedServCellMeasComesBackLater) {
    store->setMyGSMConnRfMeasDict(Dict{{"timestamp", Value("t")}});
    const auto s = screen("GSM", "Connected Serv Cell Meas");
    EXPECT_EQ(s.numberOfSections(), 1);
    EXPECT_EQ(s.titleForHeaderInSection(0), std::nullopt);
    EXPECT_EQ(s.numberOfRowsInSection(0), 1);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), kComeBackLater);
}

TEST_F(SecondLevel, GsmGsmGprsConfigComesBackLater) {
    store->setMyGSMGPRSConfigDict(Dict{{"timestamp", Value("t")}});
    const auto s = screen("GSM", "GSM GPRS Config");
    EXPECT_EQ(s.categoryKey(), "GSM GSM GPRS Config");
    EXPECT_EQ(s.numberOfSections(), 1);
    EXPECT_EQ(s.numberOfRowsInSection(0), 1);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), kComeBackLater);
}

TEST_F(SecondLevel, DeviceInfoImsiComesBackLater) {
    const auto s = screen("Device Info", "IMSI");
    EXPECT_EQ(s.numberOfSections(), 1);
    EXPECT_EQ(s.numberOfRowsInSection(0), 1);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), kComeBackLater);
}

TEST_F(SecondLevel, UnknownCategoryOfAKnownTechnologyComesBackLater) {
    const auto s = screen("LTE", "Paging Cycle");
    EXPECT_EQ(s.numberOfSections(), 1);
    EXPECT_EQ(s.titleForHeaderInSection(0), std::nullopt);
    EXPECT_EQ(s.numberOfRowsInSection(0), 1);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), kComeBackLater);
}

TEST_F(SecondLevel, ConnectedServCellMeasIsRecognisedOnlyWithoutATechnologyWord) {
    store->setMyGSMConnRfMeasDict(Dict{{"rxlev", Value(40)}, {"rxqual", Value(2)}});
    const auto s = screen("Connected", "Serv Cell Meas");
    EXPECT_EQ(s.categoryKey(), "Connected Serv Cell Meas");
    EXPECT_EQ(s.numberOfSections(), 1);
    EXPECT_EQ(s.numberOfRowsInSection(0), 1);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), (Cell{"rxlev", "40"}));
}

TEST_F(SecondLevel, GprsConfigIsRecognisedUnderItsOwnKey) {
    store->setMyGSMGPRSConfigDict(Dict{{"nmo", Value(1)}, {"t3192", Value(500)}});
    const auto s = screen("GSM", "GPRS Config");
    EXPECT_EQ(s.numberOfRowsInSection(0), 1);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), (Cell{"nmo", "1"}));
}

TEST_F(SecondLevel, ComponentCarrierInfoShowsOnlyItsFirstEntry) {
    const auto s = screen("LTE", "Component Carrier Info");
    EXPECT_EQ(s.numberOfRowsInSection(0), 1);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), kAsDequeued);
    store->setMyLTECompCarrDict(Dict{{"pcell_earfcn", Value(1300)}, {"scell", Value(2)}});
    EXPECT_EQ(s.numberOfSections(), 1);
    EXPECT_EQ(s.numberOfRowsInSection(0), 1);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), (Cell{"pcell_earfcn", "1300"}));
}

TEST_F(SecondLevel, AbsentLteServingCellInfoPrintsYouAreScrewedOncePerRowCount) {
    const CapturedLines out(standardOutputSink());
    const auto s = screen("LTE", "Serving Cell Info");
    EXPECT_EQ(s.numberOfSections(), 1);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), kAsDequeued);
    EXPECT_TRUE(out.lines().empty());
    EXPECT_EQ(s.numberOfRowsInSection(0), 1);
    EXPECT_EQ(s.numberOfRowsInSection(0), 1);
    EXPECT_EQ(out.lines(), (std::vector<std::string>{"You are screwed", "You are screwed"}));
}

TEST_F(SecondLevel, PresentLteServingCellInfoPrintsNothing) {
    store->setMyLTESCellInfoDict(Dict{{"pci", Value(7)}});
    const CapturedLines out(standardOutputSink());
    const auto s = screen("LTE", "Serving Cell Info");
    EXPECT_EQ(s.numberOfRowsInSection(0), 1);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), (Cell{"pci", "7"}));
    EXPECT_TRUE(out.lines().empty());
}

TEST_F(SecondLevel, OtherAbsentDictionariesCountOneRowSilently) {
    const CapturedLines out(standardOutputSink());
    for (const char* category : {"RRC State", "NAS", "C-DRX"})
        EXPECT_EQ(screen("LTE", category).numberOfRowsInSection(0), 1);
    for (const char* category :
         {"RRC State", "RRC Configuration", "Serving Cell Info", "NAS GMM", "NAS MM"})
        EXPECT_EQ(screen("UMTS", category).numberOfRowsInSection(0), 1);
    EXPECT_TRUE(out.lines().empty());
}

TEST_F(SecondLevel, ServingCellMeasBeforeItsFirstMetricShowsOneBlankRow) {
    const auto s = screen("LTE", "Serving Cell Meas");
    EXPECT_EQ(s.numberOfSections(), 1);
    EXPECT_EQ(s.titleForHeaderInSection(0), std::nullopt);
    EXPECT_EQ(s.numberOfRowsInSection(0), 1);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), kAsDequeued);
}

TEST_F(SecondLevel, ServingCellMeasShowsItsFirstSampleOnly) {
    test::feedLteRsrpRsrqSinr(*store, 3);
    const auto s = screen("LTE", "Serving Cell Meas");
    EXPECT_EQ(s.numberOfSections(), 1);
    expectEntries(s, 0, store->myLTE().RsrpRsrqSinr.at(0));
}

TEST_F(SecondLevel, SelReselParametersShowTheFirstElementWithoutItsNeighbours) {
    test::feedLteSelResel(*store, 2);
    const auto s = screen("LTE", "Sel Resel Parameters");
    EXPECT_EQ(s.numberOfSections(), 1);
    EXPECT_EQ(s.titleForHeaderInSection(0), std::nullopt);
    expectEntries(s, 0, store->myLTE().SelReselCellInfo.at(0));
}

TEST_F(SecondLevel, ListThatShrankBetweenCountAndCellLeavesTheCellAsDequeued) {
    test::feedLteSelResel(*store, 3);
    const auto s = screen("LTE", "EUTRA Neighbor Info");
    ASSERT_EQ(s.numberOfSections(), 3);
    const int rows = s.numberOfRowsInSection(2);
    test::feedLteSelResel(*store, 1);
    EXPECT_EQ(s.cellForRowAtIndexPath(2, 0), kAsDequeued);
    EXPECT_EQ(s.numberOfRowsInSection(2), 1);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, rows + 5), kAsDequeued);
}

TEST_F(SecondLevel, DictionaryThatShrankBetweenCountAndCellLeavesTheCellAsDequeued) {
    store->setMyLTERRCStateDict(Dict{{"a", Value(1)}, {"b", Value(2)}, {"c", Value(3)}});
    const auto s = screen("LTE", "RRC State");
    ASSERT_EQ(s.numberOfRowsInSection(0), 3);
    store->setMyLTERRCStateDict(Dict{{"a", Value(1)}});
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 2), kAsDequeued);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, -1), kAsDequeued);
}

TEST_F(SecondLevel, EveryQueryReadsTheStoreAfresh) {
    const auto s = screen("UMTS", "RRC State");
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), kAsDequeued);
    store->setMyUMTSRRCStateDict(Dict{{"state", Value("DCH")}});
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), (Cell{"state", "DCH"}));
    store->setMyUMTSRRCStateDict(Dict{{"rrc", Value("FACH")}, {"x", Value(1)}});
    EXPECT_EQ(s.numberOfRowsInSection(0), 2);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), (Cell{"rrc", "FACH"}));
    store->setMyUMTSRRCStateDict(std::nullopt);
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), kAsDequeued);
}

TEST_F(SecondLevel, DetailIsTheValueDescription) {
    Dict nested{{"mcc", Value(310)}};
    store->setMyLTEEMMContextDict(Dict{{"guti", Value(nested)},
                                       {"tai_list", Value(Array{Value(1), Value(2)})},
                                       {"ok", Value(true)},
                                       {"raw", Value(Bytes{0x0a, 0x0b})},
                                       {"ratio", Value(2.5F)}});
    const auto s = screen("LTE", "NAS");
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), (Cell{"guti", "{mcc: 310}"}));
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 1), (Cell{"tai_list", "[1, 2]"}));
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 2), (Cell{"ok", "1"}));
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 3), (Cell{"raw", "<0a0b>"}));
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 4), (Cell{"ratio", "2.5"}));
}

TEST_F(SecondLevel, SectionTitlesCountFromZeroWithoutPadding) {
    const auto s = screen("Device Info", "SIM Files");
    EXPECT_EQ(s.titleForHeaderInSection(0), "SIM Content 0");
    EXPECT_EQ(s.titleForHeaderInSection(12), "SIM Content 12");
    EXPECT_EQ(screen("LTE", "CA Status").titleForHeaderInSection(3), "Component Carrier 3");
    EXPECT_EQ(screen("LTE", "Secondary Cell Meas").titleForHeaderInSection(1),
              "Secondary Cell Meas 1");
    EXPECT_EQ(screen("UMTS", "Tx Power").titleForHeaderInSection(0), "TxPowerInfo 0");
}

TEST_F(SecondLevel, MissingSelectionsRefuseToAnswer) {
    SecondLevelViewController s(*store);
    EXPECT_THROW((void)s.numberOfSections(), ScreenSelectionError);
    s.setFirstSelection("LTE");
    try {
        (void)s.cellForRowAtIndexPath(0, 0);
        FAIL() << "no error";
    } catch (const ScreenSelectionError& error) {
        EXPECT_EQ(error.screen(), "SecondLevelViewController");
        EXPECT_EQ(error.property(), "seguedThroughRow");
    }
    s.setFirstSelection(std::nullopt);
    s.setSeguedThroughRow("C-DRX");
    try {
        (void)s.titleForHeaderInSection(0);
        FAIL() << "no error";
    } catch (const ScreenSelectionError& error) {
        EXPECT_EQ(error.property(), "firstSelection");
    }
}

TEST_F(SecondLevel, StartsWithNothingSelectedAndTheStoreItWasGiven) {
    const SecondLevelViewController s(*store);
    EXPECT_EQ(s.firstSelection(), std::nullopt);
    EXPECT_EQ(s.seguedThroughRow(), std::nullopt);
    EXPECT_EQ(s.currentCell(), std::nullopt);
    EXPECT_EQ(&s.myMetricValidator(), store.get());
}

TEST_F(SecondLevel, CurrentCellIsNotReadByTheTable) {
    auto s = screen("LTE", "Paging Cycle");
    s.setCurrentCell(Cell{"x", "y"});
    EXPECT_EQ(s.currentCell(), (Cell{"x", "y"}));
    EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), kComeBackLater);
}

TEST_F(SecondLevel, TransitionToTheThirdLevelCarriesNothing) {
    const auto s = screen("LTE", "C-DRX");
    ThirdLevelViewController details;
    const Cell tapped{"timestamp", "now"};
    s.prepareForSegue(details, &tapped);
    EXPECT_EQ(details.firstSelection(), std::nullopt);
    EXPECT_EQ(details.secondSelection(), std::nullopt);
    EXPECT_EQ(details.seguedThroughRow(), std::nullopt);
}

}  // namespace
}  // namespace pyx
