#include "ui/ScreenSelectionError.h"

#include <utility>

namespace pyx {
namespace {

std::string describe(const std::string& screen, const std::string& property,
                     const std::optional<std::string>& value) {
    return screen + ": " + property +
           (value ? " \"" + *value + "\" is not a known selection" : " is not set");
}

}  // namespace

ScreenSelectionError::ScreenSelectionError(std::string screen, std::string property,
                                           std::optional<std::string> value)
    : std::logic_error(describe(screen, property, value)),
      screen_(std::move(screen)),
      property_(std::move(property)),
      value_(std::move(value)) {}

}  // namespace pyx
