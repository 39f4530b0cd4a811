#include "ui/MenuController.h"

#include "ui/PyxViewItems.h"

namespace pyx {

int MenuController::numberOfRowsInSection(int) const {
    return static_cast<int>(titles().size());
}

Cell MenuController::cellForRowAtIndexPath(int, int row) const {
    return menuCell(titles(), row);
}

}  // namespace pyx
