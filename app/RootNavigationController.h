// The root of the navigation stack. When its view has loaded it brings the baseband link up:
// clear the old configuration, push the metric configuration from the resources, listen, and
// ask once for the SIM files.
//
// The Qt window runs viewDidLoad() when its root view has loaded; the headless mode runs it
// directly. Either way it runs once, on the main thread.
#pragma once

#include <memory>
#include <string>

#include "app/Bundle.h"
#include "baseband/VelkWrapper.h"
#include "metrics/MetricValidator.h"

namespace pyx {

class RootNavigationController {
  public:
    // With the shared client and store, and the program's own resources.
    RootNavigationController();
    RootNavigationController(std::shared_ptr<VelkWrapper> velkWrapper,
                             std::shared_ptr<MetricValidator> metricValidator, Bundle bundle);

    const std::string myAppID = "pyxtool";
    const std::string metricFileName = "oru_test_lte";
    const std::string metricFileType = "deviceconfig";
    const std::shared_ptr<VelkWrapper> myVelkWrapper;
    const std::shared_ptr<MetricValidator> myMetricValidator;

    // The start-up sequence.
    void viewDidLoad();
    void didReceiveMemoryWarning() {}

    // The query that asks the baseband for the SIM files once.
    static constexpr std::int32_t kSimQueryTriggerRef = 9999;
    static constexpr std::int32_t kSimQueryTriggerType = 0;
    static constexpr std::int32_t kSimQueryTriggerID = 0x7F0013;
    static constexpr std::int32_t kSimQueryProfileID = 0;
    static constexpr std::int32_t kSimQueryMetricID = 0;

  private:
    Bundle bundle_;
};

}  // namespace pyx
