// The deepest screen, reserved for the details of one entry picked on the category screen.
// It carries the selection path but does not read it yet: one section with one blank row.
#pragma once

#include <optional>
#include <string>

#include "ui/PyxViewItems.h"
#include "ui/TableController.h"

namespace pyx {

class ThirdLevelViewController : public TableController {
  public:
    [[nodiscard]] const std::optional<std::string>& firstSelection() const {
        return firstSelection_;
    }
    void setFirstSelection(std::optional<std::string> group) { firstSelection_ = std::move(group); }
    [[nodiscard]] const std::optional<std::string>& secondSelection() const {
        return secondSelection_;
    }
    void setSecondSelection(std::optional<std::string> entry) {
        secondSelection_ = std::move(entry);
    }
    [[nodiscard]] const std::optional<std::string>& seguedThroughRow() const {
        return seguedThroughRow_;
    }
    void setSeguedThroughRow(std::optional<std::string> category) {
        seguedThroughRow_ = std::move(category);
    }
    [[nodiscard]] const PyxViewItems& tableViewFields() const { return tableViewFields_; }

    [[nodiscard]] int numberOfSections() const override { return 1; }
    [[nodiscard]] std::optional<std::string> titleForHeaderInSection(int) const override {
        return std::nullopt;
    }
    [[nodiscard]] int numberOfRowsInSection(int) const override { return 1; }
    // Nothing is written to the cell.
    [[nodiscard]] Cell cellForRowAtIndexPath(int, int) const override { return Cell{}; }

  private:
    std::optional<std::string> firstSelection_;
    std::optional<std::string> secondSelection_;
    std::optional<std::string> seguedThroughRow_;
    const PyxViewItems tableViewFields_ = makePyxViewItems();
};

}  // namespace pyx
