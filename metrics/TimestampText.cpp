#include "metrics/TimestampText.h"

#include <cmath>
#include <cstdio>
#include <ctime>

namespace pyx {

std::string gmtOffsetText(long offsetSeconds) {
    if (offsetSeconds == 0) return "GMT";
    const char sign = offsetSeconds < 0 ? '-' : '+';
    const long magnitude = offsetSeconds < 0 ? -offsetSeconds : offsetSeconds;
    const long hours = magnitude / 3600;
    const long minutes = (magnitude % 3600) / 60;
    char text[32];
    if (minutes == 0) {
        std::snprintf(text, sizeof text, "GMT%c%ld", sign, hours);
    } else {
        std::snprintf(text, sizeof text, "GMT%c%ld:%02ld", sign, hours, minutes);
    }
    return text;
}

std::optional<std::string> timestampText(double milliseconds) {
    if (!std::isfinite(milliseconds)) return std::nullopt;
    const double seconds = std::floor(milliseconds / 1000.0);
    // Beyond about 2^62 seconds the calendar cannot hold the year anyway.
    constexpr double kLimit = 4.0e18;
    if (seconds > kLimit || seconds < -kLimit) return std::nullopt;
    const auto instant = static_cast<std::time_t>(seconds);
    std::tm local{};
    if (localtime_r(&instant, &local) == nullptr) return std::nullopt;
    const std::string zone = gmtOffsetText(local.tm_gmtoff);
    char text[96];
    const int n =
        std::snprintf(text, sizeof text, "%04lld-%02d-%02d %02d:%02d:%02d %s",
                      static_cast<long long>(local.tm_year) + 1900, local.tm_mon + 1, local.tm_mday,
                      local.tm_hour, local.tm_min, local.tm_sec, zone.c_str());
    if (n < 0 || static_cast<std::size_t>(n) >= sizeof text) return std::nullopt;
    return std::string(text, static_cast<std::size_t>(n));
}

}  // namespace pyx
