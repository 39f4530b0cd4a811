#include "sources/sim/Timeline.h"

#include <utility>

#include "baseband/velk/Names.h"

namespace pyx::sim {

Timeline::Timeline(std::uint64_t seed, std::uint64_t startTimeMs)
    : drive_(seed), startTimeMs_(startTimeMs) {}

void Timeline::configure(DeviceConfig config) {
    metrics_.clear();
    triggers_.clear();
    const std::uint64_t next = elapsedMs_ + kTickMs;
    for (const auto& item : config.metrics) metrics_.push_back({item, next});
    for (const auto& item : config.triggers) triggers_.push_back({item, next});
    config_ = std::move(config);
}

void Timeline::clear() {
    config_.reset();
    metrics_.clear();
    triggers_.clear();
}

bool Timeline::query(const MetricQuery& query) {
    const std::int64_t metricID = answeringMetric(query);
    if (!Drive::reports(metricID)) return false;
    answers_.push_back(
        Answer{triggerEvent(query.triggerID, query.triggerRef, query.triggerType, query.profileID),
               metricID});
    return true;
}

std::vector<SimEvent> Timeline::step() {
    elapsedMs_ += kTickMs;
    drive_.advance(kTickMs);

    std::vector<SimEvent> events;
    while (!answers_.empty()) {
        Answer answer = std::move(answers_.front());
        answers_.pop_front();
        events.push_back(std::move(answer.trigger));
        events.push_back(metricEvent(answer.metricID));
    }
    for (auto& due : triggers_) {
        if (due.nextMs > elapsedMs_) continue;
        due.nextMs += due.item.periodMs;
        events.push_back(triggerEvent(due.item.id, nextTriggerRef_++, 0, 0));
    }
    for (auto& due : metrics_) {
        if (due.nextMs > elapsedMs_) continue;
        due.nextMs += due.item.periodMs;
        events.push_back(metricEvent(due.item.id));
    }
    return events;
}

SimEvent Timeline::metricEvent(std::int64_t metricID) {
    return SimEvent{
        velk::kEventMetric,
        sim::metricEvent(metricID, drive_.payload(metricID, nowMs()).value_or(Bytes{}))};
}

SimEvent Timeline::triggerEvent(std::int64_t triggerID, std::int64_t triggerRef,
                                std::int64_t triggerType, std::int64_t profileID) const {
    return SimEvent{velk::kEventTrigger,
                    sim::triggerEvent(triggerID, triggerRef, triggerType, profileID)};
}

}  // namespace pyx::sim
