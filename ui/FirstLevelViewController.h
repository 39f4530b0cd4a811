// The first-level menu: the categories of the group chosen on the launch screen. Tapping a
// category opens the second-level screen with the pair (group, category).
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "metrics/MetricValidator.h"
#include "ui/MenuController.h"
#include "ui/PyxViewItems.h"

namespace pyx {

class FirstLevelViewController : public MenuController {
  public:
    // store: handed on to the screens that follow; this menu does not read it.
    explicit FirstLevelViewController(MetricValidator& store) : myMetricValidator_(&store) {}

    // The group chosen on the launch screen (the row this menu was reached through).
    [[nodiscard]] const std::optional<std::string>& seguedThroughRow() const {
        return seguedThroughRow_;
    }
    void setSeguedThroughRow(std::optional<std::string> group) {
        seguedThroughRow_ = std::move(group);
    }
    [[nodiscard]] const PyxViewItems& tableViewFields() const { return tableViewFields_; }
    [[nodiscard]] MetricValidator& myMetricValidator() const { return *myMetricValidator_; }

    // The rows and cells throw ScreenSelectionError when the group is not set or not one of
    // the four; a cell past the group's last category is left as dequeued.

    // A transition to destination, started by tapping sender (nullptr when it was not started
    // from a cell). Only a second-level screen reached from a cell receives this menu's group
    // as firstSelection and the cell's text as seguedThroughRow; anything else gets nothing.
    void prepareForSegue(TableController& destination, const Cell* sender) const;

    // The category screen of the pair (group, tapped category), titled by the category.
    [[nodiscard]] std::optional<Destination> open(const Cell& tapped) const override;

  protected:
    [[nodiscard]] const std::vector<std::string>& titles() const override;

  private:
    std::optional<std::string> seguedThroughRow_;
    const PyxViewItems tableViewFields_ = makePyxViewItems();
    MetricValidator* myMetricValidator_;
};

}  // namespace pyx
