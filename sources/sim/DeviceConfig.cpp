#include "sources/sim/DeviceConfig.h"

#include <charconv>
#include <optional>

#include "core/Format.h"

namespace pyx::sim {

namespace {

std::string describeError(int line, const std::string& reason) {
    return line > 0 ? format("line %d: %s", line, reason.c_str()) : reason;
}

std::vector<std::string_view> wordsOf(std::string_view line) {
    std::vector<std::string_view> words;
    std::size_t i = 0;
    while (i < line.size()) {
        while (i < line.size() && (line[i] == ' ' || line[i] == '\t')) ++i;
        const std::size_t start = i;
        while (i < line.size() && line[i] != ' ' && line[i] != '\t') ++i;
        if (i > start) words.push_back(line.substr(start, i - start));
    }
    return words;
}

std::optional<std::uint64_t> parseUnsigned(std::string_view text, int base) {
    std::uint64_t value = 0;
    const char* end = text.data() + text.size();
    const auto [ptr, ec] = std::from_chars(text.data(), end, value, base);
    if (ec != std::errc() || ptr != end || text.empty()) return std::nullopt;
    return value;
}

std::int64_t parseID(std::string_view word, int line) {
    const bool hex = word.size() > 2 && word[0] == '0' && (word[1] == 'x' || word[1] == 'X');
    const auto value = hex ? parseUnsigned(word.substr(2), 16) : parseUnsigned(word, 10);
    if (!value || *value == 0 || *value > 0x7FFFFFFFFFFFFFFFULL)
        throw ConfigurationError(line, format("'%.*s' is not an ID (a positive decimal or 0x "
                                              "hexadecimal number)",
                                              static_cast<int>(word.size()), word.data()));
    return static_cast<std::int64_t>(*value);
}

std::uint64_t parsePeriodMs(std::string_view word, int line) {
    std::size_t digits = 0;
    while (digits < word.size() && word[digits] >= '0' && word[digits] <= '9') ++digits;
    const std::string_view unit = word.substr(digits);
    std::uint64_t scale = 0;
    if (unit == "ms") scale = 1;
    if (unit == "s") scale = 1000;
    if (unit == "min") scale = 60'000;
    const auto count = parseUnsigned(word.substr(0, digits), 10);
    if (scale == 0 || !count || *count > 1'000'000'000ULL)
        throw ConfigurationError(line, format("'%.*s' is not a period (a whole number followed "
                                              "by ms, s or min)",
                                              static_cast<int>(word.size()), word.data()));
    const std::uint64_t periodMs = *count * scale;
    if (periodMs < kShortestPeriodMs)
        throw ConfigurationError(
            line, format("the period %.*s is shorter than %llums", static_cast<int>(word.size()),
                         word.data(), static_cast<unsigned long long>(kShortestPeriodMs)));
    return periodMs;
}

void requireText(std::string_view line, int lineNumber) {
    for (const char c : line) {
        const auto byte = static_cast<unsigned char>(c);
        if ((byte < 0x20 && c != '\t' && c != '\r') || byte == 0x7F || byte >= 0x80)
            throw ConfigurationError(lineNumber,
                                     format("the configuration is not text (byte 0x%02X)", byte));
    }
}

const ScheduledItem* findID(const std::vector<ScheduledItem>& items, std::int64_t id) {
    for (const auto& item : items)
        if (item.id == id) return &item;
    return nullptr;
}

}  // namespace

ConfigurationError::ConfigurationError(int line, const std::string& reason)
    : std::runtime_error(describeError(line, reason)), line_(line), reason_(reason) {}

DeviceConfig parseDeviceConfig(std::string_view text) {
    if (text.empty()) throw ConfigurationError(0, "the configuration is empty");
    DeviceConfig config;
    int lineNumber = 0;
    std::size_t pos = 0;
    while (pos <= text.size()) {
        const std::size_t newline = text.find('\n', pos);
        std::string_view line = text.substr(
            pos, newline == std::string_view::npos ? std::string_view::npos : newline - pos);
        pos = newline == std::string_view::npos ? text.size() + 1 : newline + 1;
        ++lineNumber;

        requireText(line, lineNumber);
        if (!line.empty() && line.back() == '\r') line.remove_suffix(1);
        if (const std::size_t hash = line.find('#'); hash != std::string_view::npos)
            line = line.substr(0, hash);
        const std::vector<std::string_view> words = wordsOf(line);
        if (words.empty()) continue;

        const std::string_view kind = words[0];
        if (kind != "metric" && kind != "trigger")
            throw ConfigurationError(lineNumber,
                                     format("unknown word '%.*s' (expected 'metric' or 'trigger')",
                                            static_cast<int>(kind.size()), kind.data()));
        if (words.size() < 4)
            throw ConfigurationError(
                lineNumber, format("'%.*s' needs an ID and a period, as in: %.*s 0x3C4E04 every 1s",
                                   static_cast<int>(kind.size()), kind.data(),
                                   static_cast<int>(kind.size()), kind.data()));
        ScheduledItem item;
        item.line = lineNumber;
        item.id = parseID(words[1], lineNumber);
        if (words[2] != "every")
            throw ConfigurationError(lineNumber,
                                     format("expected 'every' after the ID, found '%.*s'",
                                            static_cast<int>(words[2].size()), words[2].data()));
        item.periodMs = parsePeriodMs(words[3], lineNumber);
        if (words.size() > 4)
            throw ConfigurationError(lineNumber,
                                     format("unexpected '%.*s' after the period",
                                            static_cast<int>(words[4].size()), words[4].data()));

        std::vector<ScheduledItem>& items = kind == "metric" ? config.metrics : config.triggers;
        if (const ScheduledItem* first = findID(items, item.id))
            throw ConfigurationError(lineNumber,
                                     format("%.*s 0x%llX is listed twice (first on line %d)",
                                            static_cast<int>(kind.size()), kind.data(),
                                            static_cast<unsigned long long>(item.id), first->line));
        items.push_back(item);
    }
    if (config.metrics.empty()) throw ConfigurationError(0, "the configuration lists no metric");
    return config;
}

}  // namespace pyx::sim
