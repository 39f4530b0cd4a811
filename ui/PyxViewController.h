// The launch screen: one section listing the four groups. Tapping a group opens the
// first-level menu for it.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "metrics/MetricValidator.h"
#include "ui/MenuController.h"

namespace pyx {

class PyxViewController : public MenuController {
  public:
    // store: handed on to the screens that follow; this list does not read it.
    explicit PyxViewController(MetricValidator& store) : store_(&store) {}

    // A transition to destination, started by tapping sender (nullptr when it was not started
    // from a cell). Only a first-level menu reached from a cell receives the cell's text as
    // its group; any other destination gets nothing.
    void prepareForSegue(TableController& destination, const Cell* sender) const;

    // The first-level menu of the tapped group, titled by the group.
    [[nodiscard]] std::optional<Destination> open(const Cell& tapped) const override;

  protected:
    [[nodiscard]] const std::vector<std::string>& titles() const override;

  private:
    MetricValidator* store_;
};

}  // namespace pyx
