#include "sources/sim/SimulatedBaseband.h"

#include <chrono>
#include <cmath>
#include <stdexcept>
#include <string_view>
#include <utility>
#include <variant>

#include "baseband/velk/Names.h"
#include "core/Format.h"

namespace pyx::sim {

namespace {

double checkedSpeed(double speed) {
    if (!(speed > 0.0) || !std::isfinite(speed))
        throw std::invalid_argument(
            format("the simulated baseband's speed must be a positive number, not %g", speed));
    return speed;
}

}  // namespace

SimulatedBaseband::SimulatedBaseband(Options options)
    : options_{options.seed, checkedSpeed(options.speed), options.startTimeMs},
      timeline_(options.seed, options.startTimeMs.value_or(wallClockMs())) {}

SimulatedBaseband::SimulatedBaseband() : SimulatedBaseband(Options{}) {}

SimulatedBaseband::~SimulatedBaseband() {
    const std::lock_guard control(controlMutex_);
    stopThread();
}

velk::Result SimulatedBaseband::performCommand(const std::string& command, const Value& input,
                                               Value* output) {
    static_cast<void>(output);  // no command has a reply object
    auto checked = commandInput(input);
    if (auto* refused = std::get_if<velk::Result>(&checked)) return std::move(*refused);
    const Dict& dict = *std::get<const Dict*>(checked);
    if (command == velk::kCommandAddConfiguration) return addConfiguration(dict);
    if (command == velk::kCommandClearConfiguration) {
        const std::lock_guard lock(timelineMutex_);
        timeline_.clear();
        return velk::Result(velk::kCodeSuccess, "configuration cleared");
    }
    if (command == velk::kCommandQueryMetric) return queryMetric(dict);
    return velk::Result(velk::kCodeUnknownCommand, format("unknown command '%s'", command.c_str()));
}

velk::Result SimulatedBaseband::addConfiguration(const Dict& input) {
    auto parsed = parseConfiguration(input);
    if (auto* refused = std::get_if<velk::Result>(&parsed)) return std::move(*refused);
    DeviceConfig config = std::move(std::get<DeviceConfig>(parsed));
    try {
        for (const auto& item : config.metrics) {
            if (!Drive::reports(item.id))
                throw ConfigurationError(item.line,
                                         format("metric 0x%llX is not one this baseband reports",
                                                static_cast<unsigned long long>(item.id)));
        }
        const std::size_t metrics = config.metrics.size();
        const std::size_t triggers = config.triggers.size();
        {
            const std::lock_guard lock(timelineMutex_);
            timeline_.configure(std::move(config));
        }
        return velk::Result(velk::kCodeSuccess,
                            format("configuration accepted: %zu metric%s, %zu trigger%s", metrics,
                                   metrics == 1 ? "" : "s", triggers, triggers == 1 ? "" : "s"));
    } catch (const ConfigurationError& error) {
        return velk::Result(velk::kCodeBadConfiguration, error.what());
    }
}

velk::Result SimulatedBaseband::queryMetric(const Dict& input) {
    auto parsed = parseQuery(input);
    if (auto* refused = std::get_if<velk::Result>(&parsed)) return std::move(*refused);
    const MetricQuery& query = std::get<MetricQuery>(parsed);
    const std::lock_guard lock(timelineMutex_);
    if (!timeline_.query(query))
        return velk::Result(velk::kCodeUnknownMetric,
                            format("metric 0x%llX is not one this baseband reports",
                                   static_cast<unsigned long long>(query.metricID)));
    return velk::Result(velk::kCodeSuccess, "Success");
}

bool SimulatedBaseband::configured() const {
    const std::lock_guard lock(timelineMutex_);
    return timeline_.configured();
}

void SimulatedBaseband::startEvents(EventSink sink) {
    const std::lock_guard control(controlMutex_);
    stopThread();
    thread_ = std::jthread(
        [this, sink = std::move(sink)](const std::stop_token& stop) { run(stop, sink); });
}

void SimulatedBaseband::stopEvents() {
    const std::lock_guard control(controlMutex_);
    stopThread();
}

void SimulatedBaseband::stopThread() {
    if (!thread_.joinable()) return;
    thread_.request_stop();
    thread_.join();
}

void SimulatedBaseband::run(const std::stop_token& stop, const EventSink& sink) {
    using Clock = std::chrono::steady_clock;
    const auto tick =
        std::chrono::duration_cast<Clock::duration>(std::chrono::duration<double, std::milli>(
            static_cast<double>(Timeline::kTickMs) / options_.speed));
    auto next = Clock::now();
    while (!stop.stop_requested()) {
        std::vector<SimEvent> events;
        {
            const std::lock_guard lock(timelineMutex_);
            events = timeline_.step();
        }
        for (auto& event : events) {
            if (stop.stop_requested()) return;
            sink(event.stream, std::move(event.object));
        }
        next += tick;
        const auto now = Clock::now();
        // Far behind (a slow or suspended machine): go on from now rather than in a burst.
        if (now - next > std::chrono::seconds(1)) next = now;
        std::unique_lock lock(waitMutex_);
        wake_.wait_until(lock, stop, next, [] { return false; });
    }
}

}  // namespace pyx::sim
