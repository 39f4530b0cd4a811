// What every screen answers: its sections, their titles, their rows, and the two texts of a
// cell. Plain C++; the Qt adapters draw it.
#pragma once

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

class TableController {
  public:
    virtual ~TableController() = default;
    [[nodiscard]] virtual int numberOfSections() const = 0;
    [[nodiscard]] virtual std::optional<std::string> titleForHeaderInSection(int section) const = 0;
    [[nodiscard]] virtual int numberOfRowsInSection(int section) const = 0;
    [[nodiscard]] virtual Cell cellForRowAtIndexPath(int section, int row) const = 0;
};

}  // namespace pyx
