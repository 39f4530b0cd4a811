// A metric ID as the tools write it for people: hex, upper case, "0x3C4E04".
#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "core/Format.h"

namespace pyx {

[[nodiscard]] inline std::string metricIDText(std::int64_t metricID) {
    return format("0x%llX", static_cast<unsigned long long>(metricID));
}

// A record that had none says so.
[[nodiscard]] inline std::string metricIDText(const std::optional<std::int64_t>& metricID) {
    return metricID ? metricIDText(*metricID) : std::string("(no metric ID)");
}

}  // namespace pyx
