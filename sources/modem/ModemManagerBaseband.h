// A baseband that is a real modem: ModemManager on the system D-Bus. A thread of its own
// polls the modem (signal, cells, registration, SIM, bearers) at the configured rate and
// hands the values, written with our message classes, to the manager as metric events.
// No D-Bus call runs on the caller's thread, every call has a timeout, and the thread waits
// out ModemManager, the modem or the bus going away, saying each such state once on the
// system log.
#pragma once

#include <atomic>
#include <chrono>
#include <cstdint>
#include <deque>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include "baseband/velk/Transport.h"
#include "sources/sim/BasebandCommands.h"

namespace pyx::modem {

class ModemManagerBaseband : public velk::client::Transport {
  public:
    struct Options {
        // The modem whose object path ends in /Modem/N; the first one when absent.
        std::optional<std::uint32_t> modemIndex;
        // The longest any one D-Bus call may take.
        std::chrono::milliseconds callTimeout{2000};
        // The poll period when the configuration gives none.
        std::chrono::milliseconds defaultPeriod{2000};
        // How often to look again while ModemManager, the modem or the bus is missing.
        std::chrono::milliseconds retryPeriod{1000};
    };

    explicit ModemManagerBaseband(Options options);
    // Stops the polling thread.
    ~ModemManagerBaseband() override;
    ModemManagerBaseband(const ModemManagerBaseband&) = delete;
    ModemManagerBaseband& operator=(const ModemManagerBaseband&) = delete;

    // kCommandAddConfiguration: the configuration text (see resources/*.deviceconfig) is
    // accepted when it parses; its metrics that this source writes are emitted at their
    // periods, the shortest of which sets the poll rate. kCommandClearConfiguration: always
    // succeeds. kCommandQueryMetric: the SIM files (trigger 0x7F0013, metric 0) or a kind this
    // source writes, answered by a trigger event at the next poll, and the metric when that poll
    // reads the modem.
    velk::Result performCommand(const std::string& command, const Value& input,
                                Value* output) override;
    void startEvents(EventSink sink) override;
    void stopEvents() override;

  private:
    // What the polling thread shares with the caller's thread.
    struct Shared {
        struct Due {
            std::int64_t metricID = 0;
            std::chrono::milliseconds period{0};
            std::chrono::steady_clock::time_point next;
        };
        std::mutex mutex;
        bool configured = false;
        std::vector<Due> schedule;            // the configured kinds this source writes
        std::chrono::milliseconds period{0};  // the poll period
        std::uint64_t generation = 0;
        std::deque<sim::MetricQuery> queries;
        std::atomic<bool> wake{false};
    };

    // The polling thread's state (the bus connection, the modem in use, what it said and what
    // the modem said); it outlives a stop and start of the events, so a restarted thread
    // goes on where the last one stopped.
    class Poller;

    void stopThread();

    const Options options_;
    Shared shared_;
    std::unique_ptr<Poller> poller_;
    std::mutex controlMutex_;  // serialises starting and stopping the thread
    std::jthread thread_;
};

}  // namespace pyx::modem
