#include "sources/sim/BasebandCommands.h"

#include <string_view>
#include <utility>

#include "baseband/velk/Names.h"

namespace pyx::sim {

std::int64_t answeringMetric(const MetricQuery& query) {
    return query.metricID == 0 && query.triggerID == kSimFilesTriggerID ? kSimFilesMetricID
                                                                        : query.metricID;
}

std::uint64_t wallClockMs() {
    return static_cast<std::uint64_t>(std::chrono::duration_cast<std::chrono::milliseconds>(
                                          std::chrono::system_clock::now().time_since_epoch())
                                          .count());
}

std::optional<std::int64_t> intAt(const Dict& input, const char* key) {
    const Value* value = input.find(key);
    return value ? value->toInt64() : std::nullopt;
}

velk::Result badInput(const char* what) {
    return velk::Result(velk::kCodeBadInput, what);
}

std::variant<const Dict*, velk::Result> commandInput(const Value& input) {
    if (!input.isDict()) return badInput("the command's input is not a dictionary");
    const Dict& dict = input.asDict();
    if (!intAt(dict, velk::kKeyAppID)) return badInput("kKeyAppID is missing or not an integer");
    return &dict;
}

std::variant<DeviceConfig, velk::Result> parseConfiguration(const Dict& input) {
    const Value* payload = input.find(velk::kKeyPayload);
    if (!payload || !payload->isBytes()) return badInput("kKeyPayload is missing or not bytes");
    const Bytes& bytes = payload->asBytes();
    try {
        return parseDeviceConfig(
            std::string_view(reinterpret_cast<const char*>(bytes.data()), bytes.size()));
    } catch (const ConfigurationError& error) {
        return velk::Result(velk::kCodeBadConfiguration, error.what());
    }
}

std::variant<MetricQuery, velk::Result> parseQuery(const Dict& input) {
    const auto metricID = intAt(input, velk::kKeyMetricID);
    const auto triggerID = intAt(input, velk::kKeyTriggerID);
    if (!metricID) return badInput("kKeyMetricID is missing or not an integer");
    if (!triggerID) return badInput("kKeyTriggerID is missing or not an integer");
    MetricQuery query;
    query.metricID = *metricID;
    query.triggerID = *triggerID;
    query.triggerRef = intAt(input, velk::kKeyTriggerRef).value_or(0);
    query.triggerType = intAt(input, velk::kKeyTriggerType).value_or(0);
    query.profileID = intAt(input, velk::kKeyProfileID).value_or(0);
    return query;
}

Value metricEvent(std::int64_t metricID, Bytes payload) {
    Dict event;
    event.append(velk::kKeyMetricID, Value(metricID));
    event.append(velk::kKeyPayload, Value(std::move(payload)));
    event.append(velk::kKeyPayloadType, Value(std::int64_t{0}));
    event.append(velk::kKeyProfileID, Value(std::int64_t{0}));
    return Value(std::move(event));
}

Value triggerEvent(std::int64_t triggerID, std::int64_t triggerRef, std::int64_t triggerType,
                   std::int64_t profileID) {
    Dict event;
    event.append(velk::kKeyTriggerID, Value(triggerID));
    event.append(velk::kKeyTriggerRef, Value(triggerRef));
    event.append(velk::kKeyTriggerType, Value(triggerType));
    event.append(velk::kKeyProfileID, Value(profileID));
    return Value(std::move(event));
}

}  // namespace pyx::sim
