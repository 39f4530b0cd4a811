#include "ui/PyxViewController.h"

#include <memory>

#include "ui/FirstLevelViewController.h"
#include "ui/PyxViewItems.h"

namespace pyx {

const std::vector<std::string>& PyxViewController::titles() const {
    return sharedPyxViewItems().launchViewItemNames;
}

void PyxViewController::prepareForSegue(TableController& destination, const Cell* sender) const {
    if (sender == nullptr) return;
    auto* const firstLevel = dynamic_cast<FirstLevelViewController*>(&destination);
    if (firstLevel == nullptr) return;
    firstLevel->setSeguedThroughRow(sender->text);
}

std::optional<Destination> PyxViewController::open(const Cell& tapped) const {
    auto menu = std::make_shared<FirstLevelViewController>(*store_);
    prepareForSegue(*menu, &tapped);
    std::string title = menu->seguedThroughRow().value_or(std::string());
    return Destination{std::move(menu), std::move(title)};
}

}  // namespace pyx
