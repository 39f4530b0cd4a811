// The menu structure: the four groups of the launch screen and each group's categories. A
// group title, a blank and a category title form the key by which the second-level screen
// chooses what to show, so these titles must stay exactly as they are.
#pragma once

#include <map>
#include <string>
#include <vector>

namespace pyx {

struct PyxViewItems {
    // The top-level groups, in display order.
    const std::vector<std::string> launchViewItemNames;
    // Each group title's categories, in display order.
    const std::map<std::string, std::vector<std::string>> firstLevelViewItems;
};

// Builds a fresh value (each screen keeps its own copy in tableViewFields).
PyxViewItems makePyxViewItems();

// The value built once per process, read by the launch screen.
const PyxViewItems& sharedPyxViewItems();

}  // namespace pyx
