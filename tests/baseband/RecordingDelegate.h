// A delegate that records every call, with the thread it arrived on.
#pragma once

#include <functional>
#include <mutex>
#include <thread>
#include <vector>

#include "baseband/VelkWrapperDelegate.h"

namespace pyx::testing {

class RecordingDelegate : public VelkWrapperDelegate {
  public:
    struct Call {
        MetricRecord record;
        std::thread::id thread;
    };

    void metricsDidUpdate(const MetricRecord& record) override {
        {
            const std::lock_guard lock(mutex_);
            metrics_.push_back({record, std::this_thread::get_id()});
        }
        if (onMetric) onMetric(record);
    }
    void eventsDidUpdate(const MetricRecord& record) override {
        const std::lock_guard lock(mutex_);
        events_.push_back({record, std::this_thread::get_id()});
    }

    [[nodiscard]] std::vector<Call> metrics() const {
        const std::lock_guard lock(mutex_);
        return metrics_;
    }
    [[nodiscard]] std::vector<Call> events() const {
        const std::lock_guard lock(mutex_);
        return events_;
    }

    // Runs after a metric call is recorded (a test may throw from here).
    std::function<void(const MetricRecord&)> onMetric;

  private:
    mutable std::mutex mutex_;
    std::vector<Call> metrics_;
    std::vector<Call> events_;
};

}  // namespace pyx::testing
