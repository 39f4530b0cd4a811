// The category screen: the stored fields of one metric category as rows of field name and
// value. The pair (group, category) chosen on the first-level menu joins into the category
// key that selects what the screen reads; every query reads the store afresh.
#pragma once

#include <optional>
#include <string>

#include "metrics/MetricValidator.h"
#include "ui/PyxViewItems.h"
#include "ui/TableController.h"

namespace pyx {

class SecondLevelViewController : public TableController {
  public:
    // store: the store the screen reads.
    explicit SecondLevelViewController(MetricValidator& store) : myMetricValidator_(&store) {}

    // The group ("LTE"), first half of the key.
    [[nodiscard]] const std::optional<std::string>& firstSelection() const {
        return firstSelection_;
    }
    void setFirstSelection(std::optional<std::string> group) { firstSelection_ = std::move(group); }
    // The category ("C-DRX"), second half of the key.
    [[nodiscard]] const std::optional<std::string>& seguedThroughRow() const {
        return seguedThroughRow_;
    }
    void setSeguedThroughRow(std::optional<std::string> category) {
        seguedThroughRow_ = std::move(category);
    }
    // The cell last shown; the table queries do not use it.
    [[nodiscard]] const std::optional<Cell>& currentCell() const { return currentCell_; }
    void setCurrentCell(std::optional<Cell> cell) { currentCell_ = std::move(cell); }
    [[nodiscard]] MetricValidator& myMetricValidator() const { return *myMetricValidator_; }
    [[nodiscard]] const PyxViewItems& tableViewFields() const { return tableViewFields_; }

    // firstSelection, a blank, seguedThroughRow ("LTE C-DRX"); throws ScreenSelectionError
    // when either is not set. Every query below builds it first.
    [[nodiscard]] std::string categoryKey() const;

    // A list category: one section per list element (none for an empty list); any other
    // key: one section.
    [[nodiscard]] int numberOfSections() const override;
    // A list category: its prefix and the section index ("EUTRA Neighbor 0"); else none.
    [[nodiscard]] std::optional<std::string> titleForHeaderInSection(int section) const override;
    // The entries of the dictionary or of the section's list element; 1 when there is none.
    [[nodiscard]] int numberOfRowsInSection(int section) const override;
    // Entry number row: key as main text, value description as detail. A dictionary or list
    // element that is not there leaves the cell as dequeued; an unknown key reads
    // "Come back later" twice.
    [[nodiscard]] Cell cellForRowAtIndexPath(int section, int row) const override;

    // The transition to the third-level screen carries nothing from this screen.
    void prepareForSegue(TableController& destination, const Cell* sender) const;

    // The third-level placeholder, titled by the tapped entry's key (by the category when the
    // row has no text); it receives nothing else.
    [[nodiscard]] std::optional<Destination> open(const Cell& tapped) const override;
    [[nodiscard]] bool followsStore() const override { return true; }
    // categoryKey, or nothing while a selection is not set.
    [[nodiscard]] std::optional<std::string> shownCategory() const override;

  private:
    const PyxViewItems tableViewFields_ = makePyxViewItems();
    std::optional<std::string> firstSelection_;
    std::optional<std::string> seguedThroughRow_;
    std::optional<Cell> currentCell_;
    MetricValidator* myMetricValidator_;
};

}  // namespace pyx
