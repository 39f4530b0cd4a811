// The third-level placeholder: one section holding one row that nothing is written to.
#include <gtest/gtest.h>

#include "ui/ThirdLevelViewController.h"

namespace pyx {
namespace {

TEST(ThirdLevel, WithNoSelectionsShowsOneSectionHoldingOneEmptyRow) {
    const ThirdLevelViewController screen;
    EXPECT_EQ(screen.firstSelection(), std::nullopt);
    EXPECT_EQ(screen.secondSelection(), std::nullopt);
    EXPECT_EQ(screen.seguedThroughRow(), std::nullopt);
    EXPECT_EQ(screen.numberOfSections(), 1);
    EXPECT_EQ(screen.numberOfRowsInSection(0), 1);
    EXPECT_EQ(screen.titleForHeaderInSection(0), std::nullopt);
    EXPECT_EQ(screen.cellForRowAtIndexPath(0, 0), Cell{});
}

TEST(ThirdLevel, WithSelectionsSetShowsTheSameTable) {
    ThirdLevelViewController screen;
    screen.setFirstSelection("LTE");
    screen.setSecondSelection("earfcn");
    screen.setSeguedThroughRow("EUTRA Neighbor Info");
    EXPECT_EQ(screen.firstSelection(), "LTE");
    EXPECT_EQ(screen.secondSelection(), "earfcn");
    EXPECT_EQ(screen.seguedThroughRow(), "EUTRA Neighbor Info");
    EXPECT_EQ(screen.numberOfSections(), 1);
    EXPECT_EQ(screen.numberOfRowsInSection(0), 1);
    EXPECT_EQ(screen.numberOfRowsInSection(7), 1);
    EXPECT_EQ(screen.cellForRowAtIndexPath(0, 0), Cell{});
}

TEST(ThirdLevel, NothingIsWrittenToTheCellSoAReusedCellKeepsItsText) {
    const ThirdLevelViewController screen;
    const Cell cell = screen.cellForRowAtIndexPath(0, 0);
    // Unset texts leave whatever a reused cell showed.
    EXPECT_FALSE(cell.text.has_value());
    EXPECT_FALSE(cell.detail.has_value());
}

}  // namespace
}  // namespace pyx
