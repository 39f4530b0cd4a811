#include "app/RejectedRecords.h"

#include <string>

#include "core/Format.h"
#include "core/Log.h"
#include "metrics/MetricValidator.h"

namespace pyx {

RejectedRecords::RejectedRecords(MainQueue& queue) : queue_(queue) {
    queue_.setErrorHandler([this](std::exception_ptr error) {
        try {
            std::rethrow_exception(error);
        } catch (const MetricRejected& rejection) {
            ++count_;
            const std::string id =
                rejection.metricID()
                    ? format("0x%llX", static_cast<unsigned long long>(*rejection.metricID()))
                    : std::string("(none)");
            systemFault(format("pyxon: rejected metric record %s: %s", id.c_str(),
                               rejection.reason().c_str()));
        }
    });
}

RejectedRecords::~RejectedRecords() {
    queue_.setErrorHandler({});
    if (count_ > 0)
        systemFault(format("pyxon: %llu metric records rejected in all",
                           static_cast<unsigned long long>(count_)));
}

}  // namespace pyx
