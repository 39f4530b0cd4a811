// What each of our basebands does alike at the velk edge: reading a command's input (the
// application, the configuration, the query) and building the trigger and metric events that
// answer it.
#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <variant>

#include "baseband/velk/Result.h"
#include "core/Value.h"
#include "sources/sim/DeviceConfig.h"

namespace pyx::sim {

// A query as the manager sends it.
struct MetricQuery {
    std::int64_t triggerRef = 0;
    std::int64_t triggerType = 0;
    std::int64_t triggerID = 0;
    std::int64_t profileID = 0;
    std::int64_t metricID = 0;
};

// The trigger ID with which the SIM files are asked for (with metric ID 0).
inline constexpr std::int64_t kSimFilesTriggerID = 0x7F0013;
inline constexpr std::int64_t kSimFilesMetricID = 0x3C0013;

// The metric that answers query: the one asked for, or the SIM files for trigger
// kSimFilesTriggerID with metric ID 0.
[[nodiscard]] std::int64_t answeringMetric(const MetricQuery& query);

// Now, in ms since 1970.
[[nodiscard]] std::uint64_t wallClockMs();

// The integer at key, when there is one.
[[nodiscard]] std::optional<std::int64_t> intAt(const Dict& input, const char* key);
[[nodiscard]] velk::Result badInput(const char* what);

// A command's input: a dictionary with an application ID, or the result that refuses it.
[[nodiscard]] std::variant<const Dict*, velk::Result> commandInput(const Value& input);
// kCommandAddConfiguration's configuration text, parsed; or the result that refuses it.
[[nodiscard]] std::variant<DeviceConfig, velk::Result> parseConfiguration(const Dict& input);
// kCommandQueryMetric's query as sent; or the result that refuses it.
[[nodiscard]] std::variant<MetricQuery, velk::Result> parseQuery(const Dict& input);

// The events for the manager.
[[nodiscard]] Value metricEvent(std::int64_t metricID, Bytes payload);
[[nodiscard]] Value triggerEvent(std::int64_t triggerID, std::int64_t triggerRef,
                                 std::int64_t triggerType, std::int64_t profileID);

}  // namespace pyx::sim
