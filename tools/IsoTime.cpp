#include "tools/IsoTime.h"

#include <array>
#include <chrono>
#include <limits>

namespace pyx {
namespace {

constexpr std::int64_t kNsPerSecond = 1'000'000'000;

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
    const std::chrono::year_month_day date{
        std::chrono::sys_days{std::chrono::days{static_cast<std::chrono::days::rep>(days)}}};
    appendDigits(out, static_cast<std::uint64_t>(static_cast<int>(date.year())), 4);
    out += '-';
    appendDigits(out, static_cast<unsigned>(date.month()), 2);
    out += '-';
    appendDigits(out, static_cast<unsigned>(date.day()), 2);
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

std::optional<std::int64_t> parseIsoTime(std::string_view text, IsoTimeRefusal* refusal) {
    const auto refuse = [refusal](IsoTimeRefusal why) -> std::optional<std::int64_t> {
        if (refusal) *refusal = why;
        return std::nullopt;
    };
    Scanner in(text);
    std::int64_t year = 0, month = 0, day = 0, hour = 0, minute = 0, second = 0, fraction = 0;
    if (!in.number(4, year) || !in.take('-') || !in.number(2, month) || !in.take('-') ||
        !in.number(2, day))
        return refuse(IsoTimeRefusal::NotATime);
    const std::chrono::year_month_day date{std::chrono::year{static_cast<int>(year)},
                                           std::chrono::month{static_cast<unsigned>(month)},
                                           std::chrono::day{static_cast<unsigned>(day)}};
    if (!date.ok()) return refuse(IsoTimeRefusal::NotATime);
    if (in.take('T') || in.take(' ')) {
        if (!in.number(2, hour) || !in.take(':') || !in.number(2, minute))
            return refuse(IsoTimeRefusal::NotATime);
        if (in.take(':')) {
            if (!in.number(2, second)) return refuse(IsoTimeRefusal::NotATime);
            if (in.take('.') || in.take(',')) {
                int digits = 0;
                while (in.peek() >= '0' && in.peek() <= '9') {
                    std::int64_t digit = 0;
                    in.number(1, digit);
                    if (++digits > 9) return refuse(IsoTimeRefusal::NotATime);
                    fraction = fraction * 10 + digit;
                }
                if (digits == 0) return refuse(IsoTimeRefusal::NotATime);
                for (; digits < 9; ++digits) fraction *= 10;
            }
        }
        if (hour > 23 || minute > 59 || second > 60) return refuse(IsoTimeRefusal::NotATime);
    }
    std::int64_t offset = 0;
    if (!in.take('Z')) {
        const bool plus = in.take('+');
        if (plus || in.take('-')) {
            std::int64_t hours = 0, minutes = 0;
            if (!in.number(2, hours)) return refuse(IsoTimeRefusal::NotATime);
            in.take(':');
            if (!in.atEnd() && !in.number(2, minutes)) return refuse(IsoTimeRefusal::NotATime);
            if (hours > 23 || minutes > 59) return refuse(IsoTimeRefusal::NotATime);
            offset = (hours * 3600 + minutes * 60) * (plus ? 1 : -1);
        }
    }
    if (!in.atEnd()) return refuse(IsoTimeRefusal::NotATime);
    // A four-digit year keeps this far from overflowing; the nanoseconds may not fit.
    const std::int64_t days = std::chrono::sys_days{date}.time_since_epoch().count();
    std::int64_t seconds = days * 86400 + hour * 3600 + minute * 60 + second - offset;
    // Before 1970 the fraction is taken from the next second up, so that the first times that
    // fit are not lost to an intermediate product that does not.
    if (seconds < 0 && fraction > 0) {
        ++seconds;
        fraction -= kNsPerSecond;
    }
    std::int64_t ns = 0;
    if (__builtin_mul_overflow(seconds, kNsPerSecond, &ns) ||
        __builtin_add_overflow(ns, fraction, &ns))
        return refuse(IsoTimeRefusal::OutOfRange);
    return ns;
}

std::string isoTimeRange() {
    return isoTime(std::numeric_limits<std::int64_t>::min()) + " to " +
           isoTime(std::numeric_limits<std::int64_t>::max());
}

}  // namespace pyx
