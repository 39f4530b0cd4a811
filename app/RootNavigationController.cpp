#include "app/RootNavigationController.h"

#include <stdexcept>

#include "core/Log.h"

namespace pyx {

// Whichever of the two shared instances is evaluated first, the client exists before the store:
// the store's creation takes the client's shared instance, starts listening and only then
// becomes the client's delegate.
RootNavigationController::RootNavigationController()
    : RootNavigationController(VelkWrapper::sharedInstance(), MetricValidator::sharedInstance(),
                               Bundle::mainBundle()) {}

RootNavigationController::RootNavigationController(std::shared_ptr<VelkWrapper> velkWrapper,
                                                   std::shared_ptr<MetricValidator> metricValidator,
                                                   Bundle bundle)
    : myVelkWrapper(std::move(velkWrapper)),
      myMetricValidator(std::move(metricValidator)),
      bundle_(std::move(bundle)) {}

void RootNavigationController::viewDidLoad() {
    // Whatever an earlier run left configured goes first; the result does not matter.
    if (myVelkWrapper) myVelkWrapper->removeTelxConfigForAppid(myAppID);

    const auto path = bundle_.pathForResource(metricFileName, metricFileType);
    if (!path) {
        standardOutput("Metric Log File path doesnt exist");
        return;
    }

    standardOutput("pushing metric file");
    if (!myVelkWrapper) throw std::logic_error("no baseband client to push the metric file to");
    if (!myVelkWrapper->addTelxConfigForAppId(myAppID, *path)) return;

    if (myMetricValidator) {
        if (const auto& client = myMetricValidator->mySharedVelkInstance()) client->listen();
    } else {
        // A tool without a store (pyxonctl listen) listens on its own client.
        myVelkWrapper->listen();
    }

    standardOutput("Querying SIM files");
    if (myVelkWrapper) {
        myVelkWrapper->querySpecificMetric("pyxtool", kSimQueryTriggerRef, kSimQueryTriggerType,
                                           kSimQueryTriggerID, kSimQueryProfileID,
                                           kSimQueryMetricID);
    }
}

}  // namespace pyx
