#include "metrics/TimestampText.h"

#include <cmath>
#include <ctime>
#include <string>

namespace pyx {

namespace {

// Digits are written by hand: this runs for every record, and printf-style formatting
// would be the most expensive step of the intake.
void appendDigits(std::string& out, long long value, int width) {
    char digits[24];
    int n = 0;
    const bool negative = value < 0;
    unsigned long long magnitude = negative ? 0ULL - static_cast<unsigned long long>(value)
                                            : static_cast<unsigned long long>(value);
    do {
        digits[n++] = static_cast<char>('0' + magnitude % 10);
        magnitude /= 10;
    } while (magnitude != 0);
    if (negative) out.push_back('-');
    for (int pad = n; pad < width; ++pad) out.push_back('0');
    while (n > 0) out.push_back(digits[--n]);
}

void appendOffset(std::string& out, long offsetSeconds) {
    out += "GMT";
    if (offsetSeconds == 0) return;
    out.push_back(offsetSeconds < 0 ? '-' : '+');
    const long magnitude = offsetSeconds < 0 ? -offsetSeconds : offsetSeconds;
    appendDigits(out, magnitude / 3600, 1);
    const long minutes = (magnitude % 3600) / 60;
    if (minutes != 0) {
        out.push_back(':');
        appendDigits(out, minutes, 2);
    }
}

// The zone as tzset() last set it. The local time of an instant changes within a process only
// when TZ changes and tzset() is called again (localtime_r does not read TZ anew), and tzset()
// sets these: a zone whose offset, summer-time flag or names differ shows as a change.
struct Zone {
    long offset = 0;
    int daylight = 0;
    const char* standardName = nullptr;
    const char* summerName = nullptr;
    friend bool operator==(const Zone&, const Zone&) = default;
};

Zone currentZone() {
    return Zone{::timezone, ::daylight, ::tzname[0], ::tzname[1]};
}

// The text of the last second converted on this thread, with the zone it was converted in:
// records come many to a second, and the conversion to local time is the costly part.
struct LastSecond {
    bool valid = false;
    std::time_t second = 0;
    Zone zone;
    std::string text;
};

LastSecond& lastSecond() {
    thread_local LastSecond last;
    return last;
}

std::optional<std::string> convert(std::time_t instant) {
    std::tm local{};
    if (localtime_r(&instant, &local) == nullptr) return std::nullopt;
    std::string text;
    text.reserve(32);
    appendDigits(text, static_cast<long long>(local.tm_year) + 1900, 4);
    text.push_back('-');
    appendDigits(text, local.tm_mon + 1, 2);
    text.push_back('-');
    appendDigits(text, local.tm_mday, 2);
    text.push_back(' ');
    appendDigits(text, local.tm_hour, 2);
    text.push_back(':');
    appendDigits(text, local.tm_min, 2);
    text.push_back(':');
    appendDigits(text, local.tm_sec, 2);
    text.push_back(' ');
    appendOffset(text, local.tm_gmtoff);
    return text;
}

}  // namespace

std::string gmtOffsetText(long offsetSeconds) {
    std::string text;
    appendOffset(text, offsetSeconds);
    return text;
}

std::optional<std::string> timestampText(double milliseconds) {
    if (!std::isfinite(milliseconds)) return std::nullopt;
    const double seconds = std::floor(milliseconds / 1000.0);
    // Beyond about 2^62 seconds the calendar cannot hold the year anyway.
    constexpr double kLimit = 4.0e18;
    if (seconds > kLimit || seconds < -kLimit) return std::nullopt;
    const auto instant = static_cast<std::time_t>(seconds);
    LastSecond& last = lastSecond();
    if (last.valid && last.second == instant && last.zone == currentZone()) return last.text;
    auto text = convert(instant);
    if (!text) return std::nullopt;
    // The zone read after the conversion: the first conversion of the process sets it.
    last = LastSecond{true, instant, currentZone(), *text};
    return text;
}

}  // namespace pyx
