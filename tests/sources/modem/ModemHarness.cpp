#include "ModemHarness.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <thread>

#include "ScreenText.h"
#include "baseband/velk/Names.h"
#include "core/Format.h"
#include "sources/modem/ModemPayloads.h"
#include "sources/sim/Timeline.h"

namespace pyx::test {

std::string modemTestConfiguration() {
    std::string text;
    for (const modem::ModemKind& kind : modem::modemKinds())
        text += format("metric 0x%llX every %s\n", static_cast<unsigned long long>(kind.metricID),
                       kind.metricID == sim::kSimFilesMetricID ? "1s" : "200ms");
    return text + "metric 0x3C4E04 every 1s      # RRC state: not one a modem says\n";
}

namespace {

modem::ModemManagerBaseband::Options testOptions(std::optional<std::uint32_t> modemIndex) {
    modem::ModemManagerBaseband::Options options;
    options.modemIndex = modemIndex;
    options.callTimeout = std::chrono::milliseconds(2000);
    options.defaultPeriod = std::chrono::milliseconds(200);
    options.retryPeriod = std::chrono::milliseconds(200);
    return options;
}

Dict command(std::initializer_list<std::pair<const char*, Value>> entries) {
    Dict input;
    input.append(velk::kKeyAppID, Value(std::int64_t{1}));
    for (const auto& [key, value] : entries) input.append(key, value);
    return input;
}

}  // namespace

ModemHarness::ModemHarness(std::optional<std::uint32_t> modemIndex)
    : store_(MetricValidator::create(nullptr)),
      transport_(std::make_unique<modem::ModemManagerBaseband>(testOptions(modemIndex))) {}

ModemHarness::~ModemHarness() {
    transport_->stopEvents();
}

void ModemHarness::start() {
    const std::string text = modemTestConfiguration();
    const Bytes bytes(text.begin(), text.end());
    const auto cleared =
        transport_->performCommand(velk::kCommandClearConfiguration, Value(command({})), nullptr);
    ASSERT_TRUE(cleared.ok()) << cleared.message;
    const auto pushed =
        transport_->performCommand(velk::kCommandAddConfiguration,
                                   Value(command({{velk::kKeyPayload, Value(bytes)}})), nullptr);
    ASSERT_TRUE(pushed.ok()) << pushed.message;
    transport_->startEvents([this](const std::string& event, Value object) {
        const std::lock_guard lock(mutex_);
        if (event == velk::kEventTrigger) ++triggers_;
        if (event != velk::kEventMetric || !object.isDict()) return;
        pending_.push_back(std::move(object.asDict()));
    });
}

void ModemHarness::querySimFiles() {
    const auto result = transport_->performCommand(
        velk::kCommandQueryMetric,
        Value(command({{velk::kKeyTriggerID, Value(std::int64_t{0x7F0013})},
                       {velk::kKeyTriggerRef, Value(std::int64_t{9999})},
                       {velk::kKeyMetricID, Value(std::int64_t{0})}})),
        nullptr);
    ASSERT_TRUE(result.ok()) << result.message;
}

void ModemHarness::drain() {
    std::vector<Dict> events;
    {
        const std::lock_guard lock(mutex_);
        events.swap(pending_);
    }
    for (const Dict& event : events) {
        if (const Value* id = event.find(velk::kKeyMetricID))
            seen_.push_back(id->toInt64().value_or(0));
        EXPECT_TRUE(store_->isMetricIDValidWithMetricdict(event));
    }
}

bool ModemHarness::waitFor(const std::function<bool()>& condition, std::chrono::seconds timeout) {
    const auto until = std::chrono::steady_clock::now() + timeout;
    while (true) {
        drain();
        if (condition()) return true;
        if (std::chrono::steady_clock::now() > until) return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
    }
}

bool ModemHarness::waitForLog(const std::string& part, std::chrono::seconds timeout) {
    return waitFor([&] { return logLines(part) > 0; }, timeout);
}

std::optional<std::string> ModemHarness::shown(const std::string& group,
                                               const std::string& category, const std::string& key,
                                               int section) const {
    return shownOn(store_, group, category, key, section);
}

int ModemHarness::sections(const std::string& group, const std::string& category) const {
    return sectionsOn(store_, group, category);
}

int ModemHarness::logLines(const std::string& part) const {
    const auto lines = log_.lines();
    return static_cast<int>(std::count_if(lines.begin(), lines.end(), [&](const std::string& l) {
        return l.find(part) != std::string::npos;
    }));
}

int ModemHarness::triggerEvents() const {
    const std::lock_guard lock(mutex_);
    return triggers_;
}

int ModemHarness::metricEvents(std::int64_t metricID) const {
    return static_cast<int>(std::count(seen_.begin(), seen_.end(), metricID));
}

}  // namespace pyx::test
