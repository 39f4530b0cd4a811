#include "sources/sim/SimulatedBaseband.h"

#include <chrono>
#include <cmath>
#include <stdexcept>
#include <string_view>
#include <utility>

#include "baseband/velk/Names.h"
#include "core/Format.h"

namespace pyx::sim {

namespace {

std::uint64_t wallClockMs() {
    return static_cast<std::uint64_t>(std::chrono::duration_cast<std::chrono::milliseconds>(
                                          std::chrono::system_clock::now().time_since_epoch())
                                          .count());
}

double checkedSpeed(double speed) {
    if (!(speed > 0.0) || !std::isfinite(speed))
        throw std::invalid_argument(
            format("the simulated baseband's speed must be a positive number, not %g", speed));
    return speed;
}

std::optional<std::int64_t> intAt(const Dict& input, const char* key) {
    const Value* value = input.find(key);
    return value ? value->toInt64() : std::nullopt;
}

velk::Result badInput(const char* what) {
    return velk::Result(velk::kCodeBadInput, what);
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
    if (!input.isDict()) return badInput("the command's input is not a dictionary");
    const Dict& dict = input.asDict();
    if (!intAt(dict, velk::kKeyAppID)) return badInput("kKeyAppID is missing or not an integer");
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
    const Value* payload = input.find(velk::kKeyPayload);
    if (!payload || !payload->isBytes()) return badInput("kKeyPayload is missing or not bytes");
    const Bytes& bytes = payload->asBytes();
    try {
        DeviceConfig config = parseDeviceConfig(
            std::string_view(reinterpret_cast<const char*>(bytes.data()), bytes.size()));
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
    const std::lock_guard lock(timelineMutex_);
    if (!timeline_.query(query))
        return velk::Result(velk::kCodeUnknownMetric,
                            format("metric 0x%llX is not one this baseband reports",
                                   static_cast<unsigned long long>(*metricID)));
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
