// A menu: one untitled section listing titles, each row leading to a further screen. The
// launch list and the first-level menu differ only in which titles they list and what a tap
// opens.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "ui/TableController.h"

namespace pyx {

class MenuController : public TableController {
  public:
    [[nodiscard]] int numberOfSections() const final { return 1; }
    [[nodiscard]] std::optional<std::string> titleForHeaderInSection(int) const final {
        return std::nullopt;
    }
    [[nodiscard]] int numberOfRowsInSection(int section) const final;
    // The title at row; a row past the list is a cell left as dequeued.
    [[nodiscard]] Cell cellForRowAtIndexPath(int section, int row) const final;
    [[nodiscard]] bool leadsFurther() const final { return true; }

  protected:
    // The titles listed, in display order.
    [[nodiscard]] virtual const std::vector<std::string>& titles() const = 0;
};

}  // namespace pyx
