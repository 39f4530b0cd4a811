#include "metrics/TimestampText.h"

#include <cmath>
#include <ctime>

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

}  // namespace pyx
