#include "ScreenText.h"

#include "ui/SecondLevelViewController.h"

namespace pyx::test {

namespace {
SecondLevelViewController screenOf(const std::shared_ptr<MetricValidator>& store,
                                   const std::string& group, const std::string& category) {
    SecondLevelViewController screen(*store);
    screen.setFirstSelection(group);
    screen.setSeguedThroughRow(category);
    return screen;
}
}  // namespace

std::optional<std::string> shownOn(const std::shared_ptr<MetricValidator>& store,
                                   const std::string& group, const std::string& category,
                                   const std::string& key, int section) {
    const auto screen = screenOf(store, group, category);
    if (section >= screen.numberOfSections()) return std::nullopt;
    const int rows = screen.numberOfRowsInSection(section);
    for (int row = 0; row < rows; ++row) {
        const Cell cell = screen.cellForRowAtIndexPath(section, row);
        if (cell.text == key) return cell.detail;
    }
    return std::nullopt;
}

int sectionsOn(const std::shared_ptr<MetricValidator>& store, const std::string& group,
               const std::string& category) {
    return screenOf(store, group, category).numberOfSections();
}

}  // namespace pyx::test
