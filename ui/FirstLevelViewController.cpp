#include "ui/FirstLevelViewController.h"

#include <utility>

#include "ui/ScreenSelectionError.h"
#include "ui/SecondLevelViewController.h"

namespace pyx {

FirstLevelViewController::FirstLevelViewController(std::shared_ptr<MetricValidator> validator)
    : myMetricValidator_(std::move(validator)) {}

const std::vector<std::string>& FirstLevelViewController::categories() const {
    if (!seguedThroughRow_)
        throw ScreenSelectionError("FirstLevelViewController", "seguedThroughRow", std::nullopt);
    const auto found = tableViewFields_.firstLevelViewItems.find(*seguedThroughRow_);
    if (found == tableViewFields_.firstLevelViewItems.end())
        throw ScreenSelectionError("FirstLevelViewController", "seguedThroughRow",
                                   seguedThroughRow_);
    return found->second;
}

int FirstLevelViewController::numberOfRowsInSection(int) const {
    return static_cast<int>(categories().size());
}

Cell FirstLevelViewController::cellForRowAtIndexPath(int, int row) const {
    return menuCell(categories(), row);
}

void FirstLevelViewController::prepareForSegue(TableController& destination,
                                               const Cell* sender) const {
    if (sender == nullptr) return;
    auto* const secondLevel = dynamic_cast<SecondLevelViewController*>(&destination);
    if (secondLevel == nullptr) return;
    secondLevel->setFirstSelection(seguedThroughRow_);
    secondLevel->setSeguedThroughRow(sender->text);
}

void FirstLevelViewController::prepareSecondLevel(SecondLevelViewController& destination,
                                                  int row) const {
    const Cell tapped = cellForRowAtIndexPath(0, row);
    prepareForSegue(destination, &tapped);
}

}  // namespace pyx
