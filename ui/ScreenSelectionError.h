// A screen asked to show a selection it cannot: the first-level menu without a group or with
// a group the menu does not know, the second-level screen without its two selections. The
// navigation never does this; a caller that does gets this error instead of a table.
#pragma once

#include <optional>
#include <stdexcept>
#include <string>

namespace pyx {

class ScreenSelectionError : public std::logic_error {
  public:
    // screen: the controller's class name; property: the selection that is missing or wrong;
    // value: what it held (nullopt when it was not set).
    ScreenSelectionError(std::string screen, std::string property,
                         std::optional<std::string> value);

    [[nodiscard]] const std::string& screen() const { return screen_; }
    [[nodiscard]] const std::string& property() const { return property_; }
    [[nodiscard]] const std::optional<std::string>& value() const { return value_; }

  private:
    std::string screen_;
    std::string property_;
    std::optional<std::string> value_;
};

}  // namespace pyx
