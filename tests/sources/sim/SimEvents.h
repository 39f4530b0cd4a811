// Reading the simulated baseband's events in tests.
#pragma once

#include <cstdint>
#include <fstream>
#include <iterator>
#include <string>

#include "baseband/velk/Names.h"
#include "sources/sim/DeviceConfig.h"
#include "sources/sim/Timeline.h"

namespace pyx::testing {

inline std::string shippedConfigurationText() {
    std::ifstream in(std::string(PYXON_RESOURCE_DIR) + "/oru_test_lte.deviceconfig");
    return std::string((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
}

inline sim::DeviceConfig shippedConfiguration() {
    return sim::parseDeviceConfig(shippedConfigurationText());
}

inline bool isMetric(const sim::SimEvent& e) {
    return e.stream == velk::kEventMetric;
}
inline bool isTrigger(const sim::SimEvent& e) {
    return e.stream == velk::kEventTrigger;
}

inline std::int64_t metricIDOf(const Value& event) {
    return event.asDict().find(velk::kKeyMetricID)->asInt();
}
inline const Bytes& payloadOf(const Value& event) {
    return event.asDict().find(velk::kKeyPayload)->asBytes();
}

}  // namespace pyx::testing
