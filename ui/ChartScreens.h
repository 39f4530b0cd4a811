// Which category screens have a chart page, and which chart it is: the screens of the
// measured quantities the history keeps.
#pragma once

#include <optional>
#include <string_view>

#include "metrics/history/Chart.h"

namespace pyx {

// The chart of the category key ("LTE Serving Cell Meas"); nothing for a screen without one.
[[nodiscard]] std::optional<Chart> chartForCategory(std::string_view categoryKey);

}  // namespace pyx
