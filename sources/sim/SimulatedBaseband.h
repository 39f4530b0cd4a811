// A baseband that lives in the process: it takes the configuration the app pushes, answers
// queries, and emits trigger and metric events of a plausible drive from a timer thread, so
// every screen shows live data without a phone.
#pragma once

#include <condition_variable>
#include <cstdint>
#include <memory>
#include <mutex>
#include <optional>
#include <stop_token>
#include <string>
#include <thread>

#include "baseband/velk/Transport.h"
#include "sources/sim/Timeline.h"

namespace pyx::sim {

class SimulatedBaseband : public velk::client::Transport {
  public:
    struct Options {
        std::uint64_t seed = 1;
        // Simulated time runs this many times faster than real time (> 0).
        double speed = 1.0;
        // Simulated time at the start, in ms since 1970; the wall clock when not given.
        std::optional<std::uint64_t> startTimeMs;
    };

    // Throws std::invalid_argument for a speed that is not a positive number.
    explicit SimulatedBaseband(Options options);
    SimulatedBaseband();
    // Stops the timer thread.
    ~SimulatedBaseband() override;
    SimulatedBaseband(const SimulatedBaseband&) = delete;
    SimulatedBaseband& operator=(const SimulatedBaseband&) = delete;

    // kCommandAddConfiguration: kKeyPayload holds the configuration text; refused (with the
    // line at fault) when it is empty, not understood or names a metric this baseband does
    // not report. kCommandClearConfiguration: always succeeds. kCommandQueryMetric: answered
    // by a trigger event and the metric asked for, at the next step.
    velk::Result performCommand(const std::string& command, const Value& input,
                                Value* output) override;
    void startEvents(EventSink sink) override;
    void stopEvents() override;

    [[nodiscard]] bool configured() const;

  private:
    void run(const std::stop_token& stop, const EventSink& sink);
    void stopThread();
    velk::Result addConfiguration(const Dict& input);
    velk::Result queryMetric(const Dict& input);

    const Options options_;
    mutable std::mutex timelineMutex_;
    Timeline timeline_;

    std::mutex controlMutex_;  // serialises starting and stopping the timer thread
    std::mutex waitMutex_;
    std::condition_variable_any wake_;
    std::jthread thread_;
};

}  // namespace pyx::sim
