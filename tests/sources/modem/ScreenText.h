// What a category screen shows, read through the screen controller as the window would.
#pragma once

#include <optional>
#include <string>

#include "metrics/MetricValidator.h"

namespace pyx::test {

// The detail text of the row titled key in section, or nothing when there is no such row.
[[nodiscard]] std::optional<std::string> shownOn(const std::shared_ptr<MetricValidator>& store,
                                                 const std::string& group,
                                                 const std::string& category,
                                                 const std::string& key, int section = 0);
[[nodiscard]] int sectionsOn(const std::shared_ptr<MetricValidator>& store,
                             const std::string& group, const std::string& category);

}  // namespace pyx::test
