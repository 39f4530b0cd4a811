// The launch screen: one section listing the four groups. Tapping a group opens the
// first-level menu for it.
#pragma once

#include "ui/TableController.h"

namespace pyx {

class FirstLevelViewController;

class PyxViewController : public TableController {
  public:
    [[nodiscard]] int numberOfSections() const override { return 1; }
    [[nodiscard]] std::optional<std::string> titleForHeaderInSection(int) const override {
        return std::nullopt;
    }
    [[nodiscard]] int numberOfRowsInSection(int section) const override;
    // The group title at row; throws std::out_of_range past the last group.
    [[nodiscard]] Cell cellForRowAtIndexPath(int section, int row) const override;

    // A transition to destination, started by tapping sender (nullptr when it was not started
    // from a cell). Only a first-level menu reached from a cell receives the cell's text as
    // its group; any other destination gets nothing.
    void prepareForSegue(TableController& destination, const Cell* sender) const;
    // The tap on row: hands destination that row's group.
    void prepareFirstLevel(FirstLevelViewController& destination, int row) const;
};

}  // namespace pyx
