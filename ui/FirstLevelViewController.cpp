#include "ui/FirstLevelViewController.h"

#include <memory>
#include <utility>

#include "ui/ScreenSelectionError.h"
#include "ui/SecondLevelViewController.h"

namespace pyx {

const std::vector<std::string>& FirstLevelViewController::titles() const {
    if (!seguedThroughRow_)
        throw ScreenSelectionError("FirstLevelViewController", "seguedThroughRow", std::nullopt);
    const auto found = tableViewFields_.firstLevelViewItems.find(*seguedThroughRow_);
    if (found == tableViewFields_.firstLevelViewItems.end())
        throw ScreenSelectionError("FirstLevelViewController", "seguedThroughRow",
                                   seguedThroughRow_);
    return found->second;
}

void FirstLevelViewController::prepareForSegue(TableController& destination,
                                               const Cell* sender) const {
    if (sender == nullptr) return;
    auto* const secondLevel = dynamic_cast<SecondLevelViewController*>(&destination);
    if (secondLevel == nullptr) return;
    secondLevel->setFirstSelection(seguedThroughRow_);
    secondLevel->setSeguedThroughRow(sender->text);
}

std::optional<Destination> FirstLevelViewController::open(const Cell& tapped) const {
    auto category = std::make_shared<SecondLevelViewController>(*myMetricValidator_);
    prepareForSegue(*category, &tapped);
    std::string title = category->seguedThroughRow().value_or(std::string());
    return Destination{std::move(category), std::move(title)};
}

}  // namespace pyx
