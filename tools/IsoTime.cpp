#include "tools/IsoTime.h"

#include <array>
#include <charconv>

namespace pyx {
namespace {

constexpr std::int64_t kNsPerSecond = 1'000'000'000;

// Days since 1970-01-01 of a civil date, and back (proleptic Gregorian calendar).
std::int64_t daysFromCivil(std::int64_t y, unsigned m, unsigned d) {
    y -= m <= 2;
    const std::int64_t era = (y >= 0 ? y : y - 399) / 400;
    const auto yoe = static_cast<unsigned>(y - era * 400);
    const unsigned doy = (153 * (m > 2 ? m - 3 : m + 9) + 2) / 5 + d - 1;
    const unsigned doe = yoe * 365 + yoe / 4 - yoe / 100 + doy;
    return era * 146097 + static_cast<std::int64_t>(doe) - 719468;
}

void civilFromDays(std::int64_t z, std::int64_t& y, unsigned& m, unsigned& d) {
    z += 719468;
    const std::int64_t era = (z >= 0 ? z : z - 146096) / 146097;
    const auto doe = static_cast<unsigned>(z - era * 146097);
    const unsigned yoe = (doe - doe / 1460 + doe / 36524 - doe / 146096) / 365;
    const unsigned doy = doe - (365 * yoe + yoe / 4 - yoe / 100);
    const unsigned mp = (5 * doy + 2) / 153;
    d = doy - (153 * mp + 2) / 5 + 1;
    m = mp < 10 ? mp + 3 : mp - 9;
    y = static_cast<std::int64_t>(yoe) + era * 400 + (m <= 2);
}

void appendDigits(std::string& out, std::uint64_t value, int width) {
    std::array<char, 20> digits{};
    for (int i = width - 1; i >= 0; --i) {
        digits[static_cast<std::size_t>(i)] = static_cast<char>('0' + value % 10);
        value /= 10;
    }
    out.append(digits.data(), static_cast<std::size_t>(width));
}

class Scanner {
  public:
    explicit Scanner(std::string_view text) : text_(text) {}
    bool number(int digits, std::int64_t& value) {
        if (at_ + static_cast<std::size_t>(digits) > text_.size()) return false;
        value = 0;
        for (int i = 0; i < digits; ++i) {
            const char c = text_[at_++];
            if (c < '0' || c > '9') return false;
            value = value * 10 + (c - '0');
        }
        return true;
    }
    bool take(char c) {
        if (at_ < text_.size() && text_[at_] == c) {
            ++at_;
            return true;
        }
        return false;
    }
    [[nodiscard]] bool atEnd() const { return at_ == text_.size(); }
    [[nodiscard]] char peek() const { return at_ < text_.size() ? text_[at_] : '\0'; }

  private:
    std::string_view text_;
    std::size_t at_ = 0;
};

}  // namespace

void appendIsoTime(std::string& out, std::int64_t ns) {
    std::int64_t seconds = ns / kNsPerSecond;
    std::int64_t fraction = ns % kNsPerSecond;
    if (fraction < 0) {
        fraction += kNsPerSecond;
        --seconds;
    }
    std::int64_t days = seconds / 86400;
    std::int64_t inDay = seconds % 86400;
    if (inDay < 0) {
        inDay += 86400;
        --days;
    }
    std::int64_t year = 0;
    unsigned month = 0;
    unsigned day = 0;
    civilFromDays(days, year, month, day);
    appendDigits(out, static_cast<std::uint64_t>(year), 4);
    out += '-';
    appendDigits(out, month, 2);
    out += '-';
    appendDigits(out, day, 2);
    out += 'T';
    appendDigits(out, static_cast<std::uint64_t>(inDay / 3600), 2);
    out += ':';
    appendDigits(out, static_cast<std::uint64_t>(inDay / 60 % 60), 2);
    out += ':';
    appendDigits(out, static_cast<std::uint64_t>(inDay % 60), 2);
    out += '.';
    appendDigits(out, static_cast<std::uint64_t>(fraction), 9);
    out += 'Z';
}

std::string isoTime(std::int64_t ns) {
    std::string text;
    appendIsoTime(text, ns);
    return text;
}

std::optional<std::int64_t> parseIsoTime(std::string_view text) {
    Scanner in(text);
    std::int64_t year = 0, month = 0, day = 0, hour = 0, minute = 0, second = 0, fraction = 0;
    if (!in.number(4, year) || !in.take('-') || !in.number(2, month) || !in.take('-') ||
        !in.number(2, day))
        return std::nullopt;
    if (month < 1 || month > 12 || day < 1 || day > 31) return std::nullopt;
    if (in.take('T') || in.take(' ')) {
        if (!in.number(2, hour) || !in.take(':') || !in.number(2, minute)) return std::nullopt;
        if (in.take(':')) {
            if (!in.number(2, second)) return std::nullopt;
            if (in.take('.') || in.take(',')) {
                int digits = 0;
                while (in.peek() >= '0' && in.peek() <= '9') {
                    std::int64_t digit = 0;
                    in.number(1, digit);
                    if (++digits > 9) return std::nullopt;
                    fraction = fraction * 10 + digit;
                }
                if (digits == 0) return std::nullopt;
                for (; digits < 9; ++digits) fraction *= 10;
            }
        }
        if (hour > 23 || minute > 59 || second > 60) return std::nullopt;
    }
    std::int64_t offset = 0;
    if (!in.take('Z')) {
        const bool plus = in.take('+');
        if (plus || in.take('-')) {
            std::int64_t hours = 0, minutes = 0;
            if (!in.number(2, hours)) return std::nullopt;
            in.take(':');
            if (!in.atEnd() && !in.number(2, minutes)) return std::nullopt;
            offset = (hours * 3600 + minutes * 60) * (plus ? 1 : -1);
        }
    }
    if (!in.atEnd()) return std::nullopt;
    const std::int64_t days =
        daysFromCivil(year, static_cast<unsigned>(month), static_cast<unsigned>(day));
    const std::int64_t seconds = days * 86400 + hour * 3600 + minute * 60 + second - offset;
    return seconds * kNsPerSecond + fraction;
}

}  // namespace pyx
