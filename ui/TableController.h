// What every screen answers: its sections, their titles, their rows, the two texts of a cell,
// and what a tapped row leads to. Plain C++; the Qt adapters draw it.
#pragma once

#include <memory>
#include <optional>
#include <string>

namespace pyx {

// A table cell's two texts. A text left as dequeued is absent (nullopt); a set text may be
// empty.
struct Cell {
    std::optional<std::string> text;
    std::optional<std::string> detail;
    friend bool operator==(const Cell&, const Cell&) = default;
};

class TableController;

// The screen a tapped row opens, ready to show, and the title it is shown under.
struct Destination {
    std::shared_ptr<TableController> controller;
    std::string title;
};

class TableController {
  public:
    virtual ~TableController() = default;
    [[nodiscard]] virtual int numberOfSections() const = 0;
    [[nodiscard]] virtual std::optional<std::string> titleForHeaderInSection(int section) const = 0;
    [[nodiscard]] virtual int numberOfRowsInSection(int section) const = 0;
    [[nodiscard]] virtual Cell cellForRowAtIndexPath(int section, int row) const = 0;

    // The screen that tapping the row showing tapped opens, with this screen's selection
    // handed forward; nullopt when the row opens nothing.
    [[nodiscard]] virtual std::optional<Destination> open(const Cell& tapped) const {
        (void)tapped;
        return std::nullopt;
    }
    // Whether the rows are menu entries, each leading to a further list (drawn with a chevron).
    [[nodiscard]] virtual bool leadsFurther() const { return false; }
    // Whether the screen shows the store, so that the view reloads it periodically.
    [[nodiscard]] virtual bool followsStore() const { return false; }
    // The category key of the store's contents the screen shows ("LTE C-DRX"); nothing for a
    // screen that shows no category.
    [[nodiscard]] virtual std::optional<std::string> shownCategory() const { return std::nullopt; }
};

}  // namespace pyx
