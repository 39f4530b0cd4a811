// The menu structure: the four groups of the launch screen and each group's categories. A
// group title, a blank and a category title form the key by which the second-level screen
// chooses what to show, so these titles must stay exactly as they are.
#pragma once

#include <map>
#include <string>
#include <vector>

#include "ui/TableController.h"

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

// A menu row: the title at row as the main text. A row past the list is a cell left as
// dequeued, like any screen asked for an element that is not there.
Cell menuCell(const std::vector<std::string>& titles, int row);

}  // namespace pyx
