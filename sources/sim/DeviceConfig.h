// The configuration the simulated baseband accepts: which metric IDs to emit and how often,
// and which trigger events to send. A text file; see resources/oru_test_lte.deviceconfig.
//
//   # a comment, to the end of the line
//   metric 0x3C4E04 every 1s        metric ID (decimal or 0x hex), period in ms, s or min
//   trigger 0x7F0001 every 15s      a trigger event with that trigger ID
#pragma once

#include <cstdint>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

namespace pyx::sim {

// A configuration that cannot be used, with the line that says why (0: the whole text).
class ConfigurationError : public std::runtime_error {
  public:
    ConfigurationError(int line, const std::string& reason);
    [[nodiscard]] int line() const { return line_; }
    [[nodiscard]] const std::string& reason() const { return reason_; }

  private:
    int line_;
    std::string reason_;
};

struct ScheduledItem {
    std::int64_t id = 0;         // metric ID or trigger ID
    std::uint64_t periodMs = 0;  // at least kShortestPeriodMs
    int line = 0;                // where it was given
    friend bool operator==(const ScheduledItem&, const ScheduledItem&) = default;
};

struct DeviceConfig {
    std::vector<ScheduledItem> metrics;
    std::vector<ScheduledItem> triggers;
    friend bool operator==(const DeviceConfig&, const DeviceConfig&) = default;
};

inline constexpr std::uint64_t kShortestPeriodMs = 100;

// Parses the configuration text. Throws ConfigurationError for an empty text, a text without
// any metric line, an unknown word, a malformed number or period, a period shorter than
// kShortestPeriodMs, or a metric or trigger listed twice.
DeviceConfig parseDeviceConfig(std::string_view text);

}  // namespace pyx::sim
