// The date text that replaces a metric's "timestamp" (milliseconds since 1970-01-01 00:00
// UTC): "yyyy-MM-dd HH:mm:ss zzz" in the local time zone, e.g. "2017-07-14 02:40:00 GMT".
#pragma once

#include <optional>
#include <string>

namespace pyx {

// The zone text of a UTC offset in seconds: "GMT" for zero, otherwise "GMT+2", "GMT-7",
// "GMT+5:30".
[[nodiscard]] std::string gmtOffsetText(long offsetSeconds);

// The text of the instant milliseconds after the epoch, in the process's local time zone (as
// the C library took it from TZ or the system's zone file; fractions of a second are dropped).
// Nothing when the instant cannot be represented (not finite, or beyond the calendar's range).
[[nodiscard]] std::optional<std::string> timestampText(double milliseconds);

}  // namespace pyx
