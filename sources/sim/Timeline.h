// The simulated baseband's clock and schedule: it moves the drive on in steps of kTickMs of
// simulated time and says which events fall due in each step. No threads and no wall clock:
// the same seed, start time, configuration and calls give the same events.
#pragma once

#include <cstdint>
#include <deque>
#include <optional>
#include <string>
#include <vector>

#include "core/Value.h"
#include "sources/sim/BasebandCommands.h"
#include "sources/sim/DeviceConfig.h"
#include "sources/sim/Drive.h"

namespace pyx::sim {

// One event for the manager: its stream (velk::kEventMetric or velk::kEventTrigger) and its
// dictionary.
struct SimEvent {
    std::string stream;
    Value object;
    friend bool operator==(const SimEvent&, const SimEvent&) = default;
};

class Timeline {
  public:
    static constexpr std::uint64_t kTickMs = 100;

    Timeline(std::uint64_t seed, std::uint64_t startTimeMs);

    // Replaces the schedule; every configured item falls due at the next step, then once per
    // period. Metric IDs must be ones the drive reports (checked by the caller).
    void configure(DeviceConfig config);
    void clear();
    [[nodiscard]] bool configured() const { return config_.has_value(); }

    // Queues the answer to a query for the next step: a trigger event, then the metric asked
    // for (the SIM files for trigger kSimFilesTriggerID with metric ID 0). Returns false, and
    // queues nothing, when there is no such metric.
    bool query(const MetricQuery& query);

    // Advances one step and returns what falls due: query answers first, then the scheduled
    // triggers and metrics in configuration order.
    std::vector<SimEvent> step();

    // Simulated time now, in ms since 1970.
    [[nodiscard]] std::uint64_t nowMs() const { return startTimeMs_ + elapsedMs_; }
    [[nodiscard]] const Drive& drive() const { return drive_; }

  private:
    struct Due {
        ScheduledItem item;
        std::uint64_t nextMs = 0;  // elapsed time at which it is next due
    };

    SimEvent metricEvent(std::int64_t metricID);
    SimEvent triggerEvent(std::int64_t triggerID, std::int64_t triggerRef, std::int64_t triggerType,
                          std::int64_t profileID) const;

    Drive drive_;
    std::uint64_t startTimeMs_;
    std::uint64_t elapsedMs_ = 0;
    std::optional<DeviceConfig> config_;
    std::vector<Due> metrics_;
    std::vector<Due> triggers_;
    std::int64_t nextTriggerRef_ = 1;
    struct Answer {
        SimEvent trigger;
        std::int64_t metricID = 0;  // written when delivered, from the drive's state then
    };
    std::deque<Answer> answers_;
};

}  // namespace pyx::sim
