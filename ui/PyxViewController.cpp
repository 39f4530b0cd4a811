#include "ui/PyxViewController.h"

#include "ui/FirstLevelViewController.h"
#include "ui/PyxViewItems.h"

namespace pyx {

int PyxViewController::numberOfRowsInSection(int) const {
    return static_cast<int>(sharedPyxViewItems().launchViewItemNames.size());
}

Cell PyxViewController::cellForRowAtIndexPath(int, int row) const {
    return menuCell(sharedPyxViewItems().launchViewItemNames, row);
}

void PyxViewController::prepareForSegue(TableController& destination, const Cell* sender) const {
    if (sender == nullptr) return;
    auto* const firstLevel = dynamic_cast<FirstLevelViewController*>(&destination);
    if (firstLevel == nullptr) return;
    firstLevel->setSeguedThroughRow(sender->text);
}

void PyxViewController::prepareFirstLevel(FirstLevelViewController& destination, int row) const {
    const Cell tapped = cellForRowAtIndexPath(0, row);
    prepareForSegue(destination, &tapped);
}

}  // namespace pyx
