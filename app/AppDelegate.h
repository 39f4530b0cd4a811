// The application delegate: the front end tells it about the application's life cycle. It has
// nothing to do in any of those moments; the work starts when the root view has loaded
// (RootNavigationController::viewDidLoad).
#pragma once

#include <optional>
#include <string>

#include "core/Value.h"

namespace pyx {

class AppDelegate {
  public:
    // The main window's title, once a front end has made one; absent in the headless mode.
    std::optional<std::string> window;

    bool applicationDidFinishLaunchingWithOptions(const Dict& launchOptions);
    void applicationWillResignActive() {}
    void applicationDidEnterBackground() {}
    void applicationWillEnterForeground() {}
    void applicationDidBecomeActive() {}
    void applicationWillTerminate() {}
};

}  // namespace pyx
