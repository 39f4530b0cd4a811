// Every pair of the menu answered by the category screen, before any metric and after a feed in
// which every kind has arrived.
#include <gtest/gtest.h>

#include <functional>
#include <optional>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "StoreFeed.h"
#include "ui/PyxViewItems.h"
#include "ui/SecondLevelViewController.h"

namespace pyx {
namespace {

using P = MetricValidator::DictionaryProperty;
using ListOf = std::function<const EntryList&(const MetricValidator&)>;

enum class Shows {
    Dictionary,           // one row per entry of a dictionary
    FirstEntry,           // the first entry of a dictionary
    TitledList,           // one titled section per list element
    FirstElement,         // the entries of the list's first element
    ComeBackLater,        // one row, "Come back later" twice
    TitledComeBackLater,  // one titled section per list element, every row "Come back later"
};

struct Pair {
    std::string group;
    std::string category;
    Shows shows;
    std::optional<P> dictionary = std::nullopt;
    ListOf list = nullptr;
    std::string prefix = {};
};

Pair dict(std::string g, std::string c, P p) {
    return {std::move(g), std::move(c), Shows::Dictionary, p};
}
Pair firstEntry(std::string g, std::string c, P p) {
    return {std::move(g), std::move(c), Shows::FirstEntry, p};
}
Pair titled(std::string g, std::string c, ListOf l, std::string prefix) {
    return {std::move(g), std::move(c), Shows::TitledList,
            std::nullopt, std::move(l), std::move(prefix)};
}
Pair firstElement(std::string g, std::string c, ListOf l) {
    return {std::move(g), std::move(c), Shows::FirstElement, std::nullopt, std::move(l)};
}
Pair later(std::string g, std::string c) {
    return {std::move(g), std::move(c), Shows::ComeBackLater};
}

#define LIST(holder, field) \
    [](const MetricValidator& v) -> const EntryList& { return v.holder().field; }

const std::vector<Pair>& menuPairs() {
    static const std::vector<Pair> pairs{
        later("Device Info", "IMSI"),
        later("Device Info", "IMEISV"),
        titled("Device Info", "SIM Files", LIST(myCommon, simContents), "SIM Content "),
        dict("LTE", "NAS", P::myLTEEMMContextDict),
        dict("LTE", "RRC State", P::myLTERRCStateDict),
        dict("LTE", "Serving Cell Info", P::myLTESCellInfoDict),
        firstElement("LTE", "Serving Cell Meas", LIST(myLTE, RsrpRsrqSinr)),
        titled("LTE", "Tx Power", LIST(myLTE, TxPower), "TxPowerInfo "),
        firstElement("LTE", "Sel Resel Parameters", LIST(myLTE, SelReselCellInfo)),
        titled("LTE", "EUTRA Neighbor Info", LIST(myLTE, EutraNbrs), "EUTRA Neighbor "),
        dict("LTE", "C-DRX", P::myLTECDRXConfigDict),
        titled("LTE", "LTE Neighbor Cell Meas", LIST(myLTE, EutraNbrsMeas), "LTE Neighbor "),
        titled("LTE", "UMTS Neighbor Cell Meas", LIST(myLTE, UtraNbrsMeas), "UMTS Neighbor "),
        titled("LTE", "GSM Neighbor Cell Meas", LIST(myLTE, GeraNbrsMeas), "GSM Neighbor "),
        titled("LTE", "CA Status", LIST(myLTE, CAStatusList), "Component Carrier "),
        titled("LTE", "Secondary Cell Meas", LIST(myLTE, SecondaryCellMeasList),
               "Secondary Cell Meas "),
        titled("LTE", "Active Bearers", LIST(myCommon, activeBearer), "PDP "),
        dict("UMTS", "NAS GMM", P::myGMMContextDict),
        dict("UMTS", "NAS MM", P::myMMContextDict),
        dict("UMTS", "RRC State", P::myUMTSRRCStateDict),
        dict("UMTS", "RRC Configuration", P::myUMTSRRCConfigDict),
        dict("UMTS", "Serving Cell Info", P::myUMTSCellInfoDict),
        {"UMTS", "Serving Cell Meas", Shows::TitledComeBackLater, std::nullopt,
         LIST(myUMTS, rXInfo), "RxInfo "},
        titled("UMTS", "Tx Power", LIST(myUMTS, TxPower), "TxPowerInfo "),
        firstElement("UMTS", "Sel Resel Parameters", LIST(myUMTS, SelReselCellInfo)),
        titled("UMTS", "EUTRA Neighbor Info", LIST(myUMTS, eUtraNbrs), "EUTRA Neighbor "),
        titled("UMTS", "UTRA Neighbor Info", LIST(myUMTS, utraNbrs), "UTRA Neighbor "),
        titled("UMTS", "GSM Neighbor Info", LIST(myUMTS, geraNbrs), "GSM Neighbor "),
        titled("UMTS", "LTE Neighbor Cell Meas", LIST(myUMTS, eUtraNbrMeas), "LTE Neighbor "),
        titled("UMTS", "UMTS Neighbor Cell Meas", LIST(myUMTS, utraNbrMeas), "UMTS Neighbor "),
        titled("UMTS", "GSM Neighbor Cell Meas", LIST(myUMTS, geraNbrMeas), "GSM Neighbor "),
        titled("UMTS", "Active Bearers", LIST(myCommon, activeBearer), "PDP "),
        dict("GSM", "NAS GMM", P::myGMMContextDict),
        dict("GSM", "NAS MM", P::myMMContextDict),
        firstEntry("GSM", "Serving Cell Info", P::myGSMScellInfoDict),
        firstEntry("GSM", "Idle Config", P::myGSMIdleConfigInfoDict),
        firstEntry("GSM", "Idle Serv Cell Meas", P::myGSMIdleScellMeasDict),
        later("GSM", "Connected Serv Cell Meas"),
        later("GSM", "GSM GPRS Config"),
        titled("GSM", "LTE Neighbor Cell Meas", LIST(myGSM, eUtraNbrMeas), "LTE Neighbor "),
        titled("GSM", "UMTS Neighbor Cell Meas", LIST(myGSM, utraNbrMeas), "UMTS Neighbor "),
        titled("GSM", "GSM Neighbor Cell Meas", LIST(myGSM, geraNbrMeas), "GSM Neighbor "),
        titled("GSM", "Active Bearers", LIST(myCommon, activeBearer), "PDP "),
    };
    return pairs;
}

#undef LIST

const Cell kComeBackLater{"Come back later", "Come back later"};

Cell entryCell(const Dict& dictionary, int row) {
    const DictEntry& entry = dictionary.at(static_cast<std::size_t>(row));
    return Cell{entry.key, entry.value.description()};
}

void expectRows(const SecondLevelViewController& s, int section, const Dict& source,
                bool firstOnly) {
    const int rows = firstOnly ? 1 : static_cast<int>(source.size());
    ASSERT_EQ(s.numberOfRowsInSection(section), rows);
    for (int row = 0; row < rows; ++row)
        EXPECT_EQ(s.cellForRowAtIndexPath(section, row), entryCell(source, row));
}

class MenuPairs : public ::testing::TestWithParam<std::size_t> {
  protected:
    std::shared_ptr<MetricValidator> store = test::emptyStore();

    const Pair& pair() const { return menuPairs()[GetParam()]; }
    SecondLevelViewController screen() const {
        SecondLevelViewController out(*store);
        out.setFirstSelection(pair().group);
        out.setSeguedThroughRow(pair().category);
        return out;
    }
};

TEST(MenuPairList, TheMenuProducesExactlyTheseFortyThreePairs) {
    std::set<std::pair<std::string, std::string>> fromMenu;
    const PyxViewItems& items = sharedPyxViewItems();
    for (const auto& group : items.launchViewItemNames)
        for (const auto& category : items.firstLevelViewItems.at(group))
            fromMenu.emplace(group, category);
    std::set<std::pair<std::string, std::string>> here;
    for (const Pair& p : menuPairs()) here.emplace(p.group, p.category);
    EXPECT_EQ(menuPairs().size(), 43U);
    EXPECT_EQ(fromMenu, here);
}

TEST_P(MenuPairs, BeforeAnyMetric) {
    const auto s = screen();
    switch (pair().shows) {
        case Shows::TitledList:
        case Shows::TitledComeBackLater:
            EXPECT_EQ(s.numberOfSections(), 0);
            EXPECT_EQ(s.titleForHeaderInSection(0), pair().prefix + "0");
            return;
        case Shows::ComeBackLater:
            EXPECT_EQ(s.numberOfSections(), 1);
            EXPECT_EQ(s.titleForHeaderInSection(0), std::nullopt);
            EXPECT_EQ(s.numberOfRowsInSection(0), 1);
            EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), kComeBackLater);
            return;
        default:
            EXPECT_EQ(s.numberOfSections(), 1);
            EXPECT_EQ(s.titleForHeaderInSection(0), std::nullopt);
            EXPECT_EQ(s.numberOfRowsInSection(0), 1);
            EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), Cell{});
            return;
    }
}

TEST_P(MenuPairs, AfterEveryKindHasArrived) {
    constexpr int kEntries = 2;
    test::feedEveryKind(*store, kEntries);
    const auto s = screen();
    switch (pair().shows) {
        case Shows::Dictionary:
        case Shows::FirstEntry: {
            const auto& source = store->dictionary(*pair().dictionary);
            ASSERT_TRUE(source);
            EXPECT_EQ(s.numberOfSections(), 1);
            EXPECT_EQ(s.titleForHeaderInSection(0), std::nullopt);
            expectRows(s, 0, *source, pair().shows == Shows::FirstEntry);
            return;
        }
        case Shows::FirstElement: {
            const EntryList& list = pair().list(*store);
            ASSERT_FALSE(list.empty());
            EXPECT_EQ(s.numberOfSections(), 1);
            EXPECT_EQ(s.titleForHeaderInSection(0), std::nullopt);
            expectRows(s, 0, list.front(), false);
            return;
        }
        case Shows::TitledList: {
            const EntryList& list = pair().list(*store);
            ASSERT_EQ(list.size(), static_cast<std::size_t>(kEntries));
            ASSERT_EQ(s.numberOfSections(), kEntries);
            for (int section = 0; section < kEntries; ++section) {
                EXPECT_EQ(s.titleForHeaderInSection(section),
                          pair().prefix + std::to_string(section));
                expectRows(s, section, list[static_cast<std::size_t>(section)], false);
            }
            return;
        }
        case Shows::TitledComeBackLater: {
            const EntryList& list = pair().list(*store);
            ASSERT_EQ(s.numberOfSections(), kEntries);
            for (int section = 0; section < kEntries; ++section) {
                EXPECT_EQ(s.titleForHeaderInSection(section),
                          pair().prefix + std::to_string(section));
                const int rows = static_cast<int>(list[static_cast<std::size_t>(section)].size());
                ASSERT_EQ(s.numberOfRowsInSection(section), rows);
                for (int row = 0; row < rows; ++row)
                    EXPECT_EQ(s.cellForRowAtIndexPath(section, row), kComeBackLater);
            }
            return;
        }
        case Shows::ComeBackLater:
            EXPECT_EQ(s.numberOfSections(), 1);
            EXPECT_EQ(s.titleForHeaderInSection(0), std::nullopt);
            EXPECT_EQ(s.numberOfRowsInSection(0), 1);
            EXPECT_EQ(s.cellForRowAtIndexPath(0, 0), kComeBackLater);
            return;
    }
}

std::string pairName(const ::testing::TestParamInfo<std::size_t>& info) {
    const Pair& p = menuPairs()[info.param];
    std::string name;
    for (const char c : p.group + "_" + p.category)
        if (std::isalnum(static_cast<unsigned char>(c)) || c == '_') name += c;
    return name;
}

INSTANTIATE_TEST_SUITE_P(EveryMenuPair, MenuPairs, ::testing::Range<std::size_t>(0, 43), pairName);

}  // namespace
}  // namespace pyx
