// The modem source under test, as the viewer runs it: the transport gets the configuration
// and hands its events over; the test thread feeds them to a store of its own and reads what
// the screens show.
#pragma once

#include <chrono>
#include <cstdint>
#include <functional>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include "core/Log.h"
#include "metrics/MetricValidator.h"
#include "sources/modem/ModemManagerBaseband.h"

namespace pyx::test {

// The configuration the tests push: every kind the modem source writes, polled every 200 ms
// (the SIM files every second), and one kind it does not write.
[[nodiscard]] std::string modemTestConfiguration();

class ModemHarness {
  public:
    // The first modem, or the one whose object path ends in /Modem/modemIndex.
    explicit ModemHarness(std::optional<std::uint32_t> modemIndex = std::nullopt);
    ~ModemHarness();

    // Pushes modemTestConfiguration() (asserting it is accepted) and starts the events.
    void start();
    // Asks for the SIM files as the viewer does.
    void querySimFiles();

    // Feeds what came so far to the store; true once condition holds, false after timeout.
    bool waitFor(const std::function<bool()>& condition,
                 std::chrono::seconds timeout = std::chrono::seconds(30));
    bool waitForLog(const std::string& part,
                    std::chrono::seconds timeout = std::chrono::seconds(30));

    // What the screen of group and category shows in row key of section: the detail text,
    // or nothing when the section has no such row.
    [[nodiscard]] std::optional<std::string> shown(const std::string& group,
                                                   const std::string& category,
                                                   const std::string& key, int section = 0) const;
    [[nodiscard]] int sections(const std::string& group, const std::string& category) const;
    // The system log lines that contain part.
    [[nodiscard]] int logLines(const std::string& part) const;
    [[nodiscard]] int metricEvents(std::int64_t metricID) const;
    [[nodiscard]] int triggerEvents() const;

    modem::ModemManagerBaseband& transport() { return *transport_; }
    MetricValidator& store() { return *store_; }

  private:
    void drain();

    CapturedLines log_{systemLogSink()};
    std::shared_ptr<MetricValidator> store_;
    std::unique_ptr<modem::ModemManagerBaseband> transport_;
    mutable std::mutex mutex_;
    std::vector<Dict> pending_;
    std::vector<std::int64_t> seen_;
    int triggers_ = 0;  // under mutex_
};

}  // namespace pyx::test
