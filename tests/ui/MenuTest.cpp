// The launch screen and the first-level menu: what they list and what they hand forward.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "StoreFeed.h"
#include "ui/FirstLevelViewController.h"
#include "ui/PyxViewController.h"
#include "ui/PyxViewItems.h"
#include "ui/ScreenSelectionError.h"
#include "ui/SecondLevelViewController.h"
#include "ui/ThirdLevelViewController.h"

namespace pyx {
namespace {

std::vector<std::string> texts(const TableController& screen) {
    std::vector<std::string> out;
    for (int row = 0; row < screen.numberOfRowsInSection(0); ++row)
        out.push_back(screen.cellForRowAtIndexPath(0, row).text.value_or("<unset>"));
    return out;
}

class Menu : public ::testing::Test {
  protected:
    std::shared_ptr<MetricValidator> store = test::emptyStore();
    PyxViewController launch{*store};

    FirstLevelViewController menuFor(const std::string& group) {
        FirstLevelViewController menu(*store);
        menu.setSeguedThroughRow(group);
        return menu;
    }
};

TEST_F(Menu, LaunchScreenShowsExactlyFourGroupsInOrder) {
    EXPECT_EQ(launch.numberOfSections(), 1);
    EXPECT_EQ(launch.numberOfRowsInSection(0), 4);
    EXPECT_EQ(texts(launch), (std::vector<std::string>{"Device Info", "LTE", "UMTS", "GSM"}));
    EXPECT_EQ(launch.titleForHeaderInSection(0), std::nullopt);
    EXPECT_EQ(launch.cellForRowAtIndexPath(0, 0).detail, std::nullopt);
}

TEST_F(Menu, GroupsShowTheirNumberOfCategories) {
    EXPECT_EQ(menuFor("LTE").numberOfRowsInSection(0), 14);
    EXPECT_EQ(menuFor("UMTS").numberOfRowsInSection(0), 15);
    EXPECT_EQ(menuFor("GSM").numberOfRowsInSection(0), 11);
    EXPECT_EQ(menuFor("Device Info").numberOfRowsInSection(0), 3);
    EXPECT_EQ(menuFor("LTE").numberOfSections(), 1);
}

TEST_F(Menu, CategoriesAreListedInDisplayOrder) {
    EXPECT_EQ(texts(menuFor("Device Info")),
              (std::vector<std::string>{"IMSI", "IMEISV", "SIM Files"}));
    EXPECT_EQ(texts(menuFor("LTE")),
              (std::vector<std::string>{"NAS", "RRC State", "Serving Cell Info",
                                        "Serving Cell Meas", "Tx Power", "Sel Resel Parameters",
                                        "EUTRA Neighbor Info", "C-DRX", "LTE Neighbor Cell Meas",
                                        "UMTS Neighbor Cell Meas", "GSM Neighbor Cell Meas",
                                        "CA Status", "Secondary Cell Meas", "Active Bearers"}));
    EXPECT_EQ(texts(menuFor("UMTS")),
              (std::vector<std::string>{
                  "NAS GMM", "NAS MM", "RRC State", "RRC Configuration", "Serving Cell Info",
                  "Serving Cell Meas", "Tx Power", "Sel Resel Parameters", "EUTRA Neighbor Info",
                  "UTRA Neighbor Info", "GSM Neighbor Info", "LTE Neighbor Cell Meas",
                  "UMTS Neighbor Cell Meas", "GSM Neighbor Cell Meas", "Active Bearers"}));
    EXPECT_EQ(texts(menuFor("GSM")),
              (std::vector<std::string>{
                  "NAS GMM", "NAS MM", "Serving Cell Info", "Idle Config", "Idle Serv Cell Meas",
                  "Connected Serv Cell Meas", "GSM GPRS Config", "LTE Neighbor Cell Meas",
                  "UMTS Neighbor Cell Meas", "GSM Neighbor Cell Meas", "Active Bearers"}));
}

TEST_F(Menu, ChoosingUmtsThenTxPowerHandsTheSecondLevelThePair) {
    const auto opened = launch.open(launch.cellForRowAtIndexPath(0, 2));
    ASSERT_TRUE(opened);
    const auto* const menu =
        dynamic_cast<const FirstLevelViewController*>(opened->controller.get());
    ASSERT_NE(menu, nullptr);
    EXPECT_EQ(menu->seguedThroughRow(), "UMTS");

    const auto chosen = menu->open(menu->cellForRowAtIndexPath(0, 6));
    ASSERT_TRUE(chosen);
    const auto* const screen =
        dynamic_cast<const SecondLevelViewController*>(chosen->controller.get());
    ASSERT_NE(screen, nullptr);
    EXPECT_EQ(screen->firstSelection(), "UMTS");
    EXPECT_EQ(screen->seguedThroughRow(), "Tx Power");
    EXPECT_EQ(screen->categoryKey(), "UMTS Tx Power");
}

TEST_F(Menu, SegueToAnyOtherKindOfDestinationPassesNothing) {
    const Cell tapped{"LTE", std::nullopt};

    // The launch screen hands its group only to a first-level menu.
    SecondLevelViewController notAMenu(*store);
    launch.prepareForSegue(notAMenu, &tapped);
    EXPECT_EQ(notAMenu.firstSelection(), std::nullopt);
    EXPECT_EQ(notAMenu.seguedThroughRow(), std::nullopt);
    ThirdLevelViewController details;
    launch.prepareForSegue(details, &tapped);
    EXPECT_EQ(details.seguedThroughRow(), std::nullopt);

    // The first-level menu hands its pair only to a second-level screen.
    FirstLevelViewController menu = menuFor("GSM");
    FirstLevelViewController otherMenu(*store);
    menu.prepareForSegue(otherMenu, &tapped);
    EXPECT_EQ(otherMenu.seguedThroughRow(), std::nullopt);
    menu.prepareForSegue(details, &tapped);
    EXPECT_EQ(details.firstSelection(), std::nullopt);
    EXPECT_EQ(details.seguedThroughRow(), std::nullopt);
}

TEST_F(Menu, SegueNotStartedFromACellPassesNothing) {
    FirstLevelViewController menu(*store);
    launch.prepareForSegue(menu, nullptr);
    EXPECT_EQ(menu.seguedThroughRow(), std::nullopt);

    SecondLevelViewController screen(*store);
    menuFor("LTE").prepareForSegue(screen, nullptr);
    EXPECT_EQ(screen.firstSelection(), std::nullopt);
    EXPECT_EQ(screen.seguedThroughRow(), std::nullopt);
}

TEST_F(Menu, CellWithoutTextHandsNoCategory) {
    SecondLevelViewController screen(*store);
    const Cell blank{};
    menuFor("LTE").prepareForSegue(screen, &blank);
    EXPECT_EQ(screen.firstSelection(), "LTE");
    EXPECT_EQ(screen.seguedThroughRow(), std::nullopt);
}

TEST_F(Menu, FirstLevelWithoutGroupRefusesToAnswer) {
    const FirstLevelViewController menu(*store);
    try {
        (void)menu.numberOfRowsInSection(0);
        FAIL() << "no error";
    } catch (const ScreenSelectionError& error) {
        EXPECT_EQ(error.screen(), "FirstLevelViewController");
        EXPECT_EQ(error.property(), "seguedThroughRow");
        EXPECT_EQ(error.value(), std::nullopt);
        EXPECT_STREQ(error.what(), "FirstLevelViewController: seguedThroughRow is not set");
    }
}

TEST_F(Menu, FirstLevelWithUnknownGroupRefusesToAnswer) {
    const FirstLevelViewController menu = menuFor("CDMA");
    try {
        (void)menu.cellForRowAtIndexPath(0, 0);
        FAIL() << "no error";
    } catch (const ScreenSelectionError& error) {
        EXPECT_EQ(error.value(), "CDMA");
        EXPECT_STREQ(error.what(),
                     "FirstLevelViewController: seguedThroughRow \"CDMA\" is not a known "
                     "selection");
    }
}

TEST_F(Menu, RowPastTheListIsACellLeftAsDequeued) {
    EXPECT_EQ(launch.cellForRowAtIndexPath(0, 4), Cell{});
    EXPECT_EQ(launch.cellForRowAtIndexPath(0, -1), Cell{});
    EXPECT_EQ(menuFor("Device Info").cellForRowAtIndexPath(0, 3), Cell{});
    EXPECT_EQ(menuFor("Device Info").cellForRowAtIndexPath(0, 2).text, "SIM Files");
}

TEST_F(Menu, EveryScreenKeepsItsOwnCopyOfTheMenuItems) {
    const PyxViewItems& shared = sharedPyxViewItems();
    EXPECT_EQ(&shared, &sharedPyxViewItems());
    const FirstLevelViewController menu(*store);
    const SecondLevelViewController screen(*store);
    const ThirdLevelViewController details;
    for (const PyxViewItems* copy :
         {&menu.tableViewFields(), &screen.tableViewFields(), &details.tableViewFields()}) {
        EXPECT_NE(copy, &shared);
        EXPECT_EQ(copy->launchViewItemNames, shared.launchViewItemNames);
        EXPECT_EQ(copy->firstLevelViewItems, shared.firstLevelViewItems);
    }
    EXPECT_EQ(shared.firstLevelViewItems.size(), 4U);
}

TEST_F(Menu, EachScreenSaysWhatATappedRowOpens) {
    const auto menu = launch.open(Cell{"GSM", std::nullopt});
    ASSERT_TRUE(menu);
    EXPECT_EQ(menu->title, "GSM");
    EXPECT_EQ(texts(*menu->controller).size(), 11U);
    EXPECT_TRUE(launch.leadsFurther());
    EXPECT_TRUE(menu->controller->leadsFurther());

    const auto screen = menu->controller->open(Cell{"NAS MM", std::nullopt});
    ASSERT_TRUE(screen);
    EXPECT_EQ(screen->title, "NAS MM");
    EXPECT_TRUE(screen->controller->followsStore());
    EXPECT_FALSE(screen->controller->leadsFurther());
    EXPECT_EQ(screen->controller->cellForRowAtIndexPath(0, 0), Cell{});

    const auto details = screen->controller->open(Cell{"mm_state", "3"});
    ASSERT_TRUE(details);
    EXPECT_EQ(details->title, "mm_state");
    EXPECT_EQ(screen->controller->open(Cell{})->title, "NAS MM");
    EXPECT_FALSE(details->controller->followsStore());
    EXPECT_FALSE(details->controller->open(Cell{"x", "y"}).has_value());
}

TEST_F(Menu, FirstLevelKeepsTheStoreItWasGiven) {
    const FirstLevelViewController menu(*store);
    EXPECT_EQ(&menu.myMetricValidator(), store.get());
    EXPECT_EQ(menu.seguedThroughRow(), std::nullopt);
}

}  // namespace
}  // namespace pyx
