// The window: the Qt Quick front end that the pyxon program runs when a display is there.
#pragma once

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <utility>

namespace pyx {

class DriveTrack;

struct WindowOptions {
    // When set: after screenshotDelayMs, render the launch list, each group's menu and every
    // category screen of the menu to PNG files in this folder, then quit with 0.
    std::optional<std::string> screenshotDir;
    int screenshotDelayMs = 3000;
    // The pause before the chart pages are rendered, so that their lines are long.
    int screenshotChartDelayMs = 5000;
    // When set: the chart page of this (group, category) screen is opened at start.
    std::optional<std::pair<std::string, std::string>> chart;
    // The drive's track: the Drive map page and, with --gps, the status line.
    std::shared_ptr<const DriveTrack> drive;
};

// Creates the application, lets its event loop drain the main queue, shows the window, calls
// rootViewDidLoad once the launch list has loaded, and returns the event loop's exit status.
int runWindow(int& argc, char** argv, const WindowOptions& options,
              std::function<void()> rootViewDidLoad);

// Ends the window's event loop with status 0; runWindow then returns. Run it on the main queue
// (the event loop drains it), e.g. when SIGINT or SIGTERM arrives.
void quitWindow();

// False when there is neither an X11 nor a Wayland display and the platform is not offscreen.
bool displayAvailable();

}  // namespace pyx
