// The outcome of one baseband command: a signed 32-bit code (0 is success) and a message.
#pragma once

#include <cstdint>
#include <string>
#include <utility>

namespace velk {

// Result codes of this client and of its transports. A transport may answer with codes of its
// own; only 0 means success.
inline constexpr std::int32_t kCodeSuccess = 0;
// What a result holds before a command has answered.
inline constexpr std::int32_t kCodeNotSet = static_cast<std::int32_t>(0xE020E002U);
// No transport to the baseband (none registered, or no manager).
inline constexpr std::int32_t kCodeNoTransport = static_cast<std::int32_t>(0xE020E003U);
// The command name is not one the baseband knows.
inline constexpr std::int32_t kCodeUnknownCommand = static_cast<std::int32_t>(0xE020E004U);
// The command's input lacks a key or holds a value of the wrong kind.
inline constexpr std::int32_t kCodeBadInput = static_cast<std::int32_t>(0xE020E005U);
// A configuration that cannot be used (empty, or not understood).
inline constexpr std::int32_t kCodeBadConfiguration = static_cast<std::int32_t>(0xE020E006U);
// A query for a metric the baseband does not report.
inline constexpr std::int32_t kCodeUnknownMetric = static_cast<std::int32_t>(0xE020E007U);

struct Result {
    Result() = default;
    Result(std::int32_t resultCode, std::string resultMessage)
        : code(resultCode), message(std::move(resultMessage)) {}

    [[nodiscard]] bool ok() const { return code == kCodeSuccess; }

    std::int32_t code = kCodeNotSet;
    std::string message;

    friend bool operator==(const Result& a, const Result& b) = default;
};

}  // namespace velk
