// The receiver of the baseband client's events. Both calls arrive on the main queue.
#pragma once

#include "baseband/MetricRecord.h"

namespace pyx {

class VelkWrapperDelegate {
  public:
    virtual ~VelkWrapperDelegate() = default;
    virtual void metricsDidUpdate(const MetricRecord& record) = 0;
    virtual void eventsDidUpdate(const MetricRecord& record) = 0;
};

}  // namespace pyx
