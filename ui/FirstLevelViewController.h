// The first-level menu: the categories of the group chosen on the launch screen. Tapping a
// category opens the second-level screen with the pair (group, category).
#pragma once

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "metrics/MetricValidator.h"
#include "ui/PyxViewItems.h"
#include "ui/TableController.h"

namespace pyx {

class SecondLevelViewController;

class FirstLevelViewController : public TableController {
  public:
    // validator: kept for the screens that follow; this menu does not read it.
    explicit FirstLevelViewController(
        std::shared_ptr<MetricValidator> validator = MetricValidator::sharedInstance());

    // The group chosen on the launch screen (the row this menu was reached through).
    [[nodiscard]] const std::optional<std::string>& seguedThroughRow() const {
        return seguedThroughRow_;
    }
    void setSeguedThroughRow(std::optional<std::string> group) {
        seguedThroughRow_ = std::move(group);
    }
    [[nodiscard]] const PyxViewItems& tableViewFields() const { return tableViewFields_; }
    [[nodiscard]] const std::shared_ptr<MetricValidator>& myMetricValidator() const {
        return myMetricValidator_;
    }

    [[nodiscard]] int numberOfSections() const override { return 1; }
    [[nodiscard]] std::optional<std::string> titleForHeaderInSection(int) const override {
        return std::nullopt;
    }
    // Both throw ScreenSelectionError when the group is not set or not one of the four;
    // the cell throws std::out_of_range past the group's last category.
    [[nodiscard]] int numberOfRowsInSection(int section) const override;
    [[nodiscard]] Cell cellForRowAtIndexPath(int section, int row) const override;

    // A transition to destination, started by tapping sender (nullptr when it was not started
    // from a cell). Only a second-level screen reached from a cell receives this menu's group
    // as firstSelection and the cell's text as seguedThroughRow; anything else gets nothing.
    void prepareForSegue(TableController& destination, const Cell* sender) const;
    // The tap on row: hands destination the group and that row's category.
    void prepareSecondLevel(SecondLevelViewController& destination, int row) const;

  private:
    [[nodiscard]] const std::vector<std::string>& categories() const;

    std::optional<std::string> seguedThroughRow_;
    const PyxViewItems tableViewFields_ = makePyxViewItems();
    std::shared_ptr<MetricValidator> myMetricValidator_;
};

}  // namespace pyx
