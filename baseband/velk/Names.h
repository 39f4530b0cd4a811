// The names the baseband manager speaks: its commands, its two event streams and the keys of
// the dictionaries that travel in both directions. Each is a NUL-terminated C string.
#pragma once

namespace velk {

// Commands.
inline constexpr char kCommandAddConfiguration[] = "AddConfiguration";
inline constexpr char kCommandClearConfiguration[] = "ClearConfiguration";
inline constexpr char kCommandQueryMetric[] = "QueryMetric";

// Event streams.
inline constexpr char kEventTrigger[] = "TriggerEvent";
inline constexpr char kEventMetric[] = "MetricEvent";

// Dictionary keys of commands and events.
inline constexpr char kKeyAppID[] = "kKeyAppID";
inline constexpr char kKeyPayload[] = "kKeyPayload";
inline constexpr char kKeyPayloadType[] = "kKeyPayloadType";
inline constexpr char kKeyTriggerRef[] = "kKeyTriggerRef";
inline constexpr char kKeyTriggerType[] = "kKeyTriggerType";
inline constexpr char kKeyTriggerID[] = "kKeyTriggerID";
inline constexpr char kKeyProfileID[] = "kKeyProfileID";
inline constexpr char kKeyMetricID[] = "kKeyMetricID";

}  // namespace velk
