#include "app/Application.h"

#include <CLI/CLI.hpp>

#include <csignal>
#include <cstdint>
#include <functional>
#include <iostream>
#include <optional>
#include <string>

#include "app/AppDelegate.h"
#include "app/ProgramSource.h"
#include "app/RejectedRecords.h"
#include "app/RootNavigationController.h"
#include "app/StopOnSignal.h"
#include "baseband/VelkWrapper.h"
#include "core/Format.h"
#include "core/Log.h"
#include "core/MainQueue.h"
#include "metrics/MetricValidator.h"
#include "metrics/history/History.h"
#include "sources/Source.h"
#include "ui/DriveTrack.h"
#ifdef PYXON_HAVE_WINDOW
#include "ui/ChartScreens.h"
#include "ui/qt/QtFrontEnd.h"
#endif

namespace pyx {
namespace {

struct Options {
    bool headless = false;
    SourceArgs source;
    std::optional<std::string> screenshots;
    std::optional<std::string> chart;
};

// Screenshots are taken after this much simulated time per second, unless --speed says
// otherwise, so that the charts have long lines.
constexpr double kScreenshotSpeed = 30;

int runHeadless(RootNavigationController& root) {
    MainQueue& mainQueue = MainQueue::shared();
    mainQueue.claimCurrentThread();
    root.viewDidLoad();
    mainQueue.run();
    return 0;
}

}  // namespace

int runPyxon(int argc, char** argv) {
    CLI::App cli{
        "Pyxon shows what the baseband reports: serving cell, neighbours, RRC state, transmit\n"
        "power, carrier aggregation, NAS contexts, bearers and SIM files, from the built-in\n"
        "simulated baseband, a real modem through ModemManager or a Qualcomm modem's\n"
        "diagnostic port.",
        "pyxon"};
    Options options;
    cli.add_flag("--headless", options.headless,
                 "No window: print the system's lines as events arrive, until SIGINT or SIGTERM");
    options.source.addTo(cli);
    cli.add_option("--screenshots", options.screenshots,
                   "Render every screen and chart page to PNG files in this folder, then quit")
        ->type_name("DIR");
    cli.add_option("--chart", options.chart,
                   "Open the chart page of the screen GROUP/CATEGORY at start (window only)")
        ->type_name("GROUP/CATEGORY");
    cli.set_version_flag("--version", std::string("pyxon ") + PYXON_VERSION);
    cli.footer(std::string(sources::sourceHelp()) + "\n" + std::string(sources::recordingHelp()) +
               "\nExamples:\n"
               "  pyxon --headless --speed 20\n"
               "  pyxon --source modem\n"
               "  pyxon --source modem --record drive.pyxrec\n"
               "  pyxon --source replay:drive.pyxrec --speed 4 --loop\n"
               "  pyxon --source diag --qmdl drive.qmdl\n"
               "  pyxon --source diag:drive.qmdl --speed 4\n"
               "  pyxon --chart 'LTE/Serving Cell Meas'\n"
               "  pyxon --screenshots shots   (simulated time runs 30 times faster unless "
               "--speed is given)\n");
    try {
        cli.parse(argc, argv);
    } catch (const CLI::CallForHelp& e) {
        return cli.exit(e);
    } catch (const CLI::CallForVersion& e) {
        return cli.exit(e);
    } catch (const CLI::ParseError& e) {
        std::cerr << "pyxon: " << e.what() << "\nRun with --help for more information.\n";
        return 2;
    }
#ifdef PYXON_HAVE_WINDOW
    const bool window = !options.headless && (options.screenshots || displayAvailable());
    if (!options.headless && !window) systemFault("pyxon: no display available, running headless");
#else
    const bool window = false;
    if (!options.headless) systemFault("pyxon: built without the window, running headless");
#endif
    if (options.screenshots && !window) {
        std::cerr << "pyxon: --screenshots needs the window\n";
        return 2;
    }
    std::optional<std::pair<std::string, std::string>> chart;
    if (options.chart) {
        const auto slash = options.chart->find('/');
        if (slash != std::string::npos)
            chart.emplace(options.chart->substr(0, slash), options.chart->substr(slash + 1));
#ifdef PYXON_HAVE_WINDOW
        if (!chart || !chartForCategory(chart->first + " " + chart->second)) {
            std::cerr << "pyxon: --chart: \"" << *options.chart
                      << "\" is not a screen with a chart (e.g. \"LTE/Serving Cell Meas\")\n";
            return 2;
        }
#endif
        if (!window) {
            std::cerr << "pyxon: --chart needs the window\n";
            return 2;
        }
    }
    if (options.screenshots && cli.get_option("--speed")->count() == 0)
        options.source.speed = kScreenshotSpeed;

    // SIGINT and SIGTERM end the program through its exit path below, the window's too (a
    // Ctrl-C in its terminal, a logout), so that the source stops and a recording is closed.
    std::function<void()> stop = [] { MainQueue::shared().stop(); };
#ifdef PYXON_HAVE_WINDOW
    if (window) stop = [] { MainQueue::shared().post(quitWindow); };
#endif
    const StopOnSignal stopOnSignal(std::move(stop));

    const RejectedRecords rejected(MainQueue::shared());

    // Where the drive went (--gps): fixes arrive on the gpsd client's thread and are taken in
    // on the main thread, with the serving level the store shows then.
    const auto drive = std::make_shared<DriveTrack>();
    std::optional<ProgramSource> source;
    try {
        source.emplace(
            openProgramSource(options.source, PYXON_VERSION, {}, [drive](const gps::Fix& fix) {
                MainQueue::shared().post([drive, fix] { drive->addFix(fix); });
            }));
    } catch (const sources::SourceError& e) {
        std::cerr << "pyxon: " << e.what() << "\n";
        return 2;
    }
    if (const gps::GpsdClient* gps = source->gps())
        drive->followGpsd([gps] { return gps->state(); }, gps->address().text());

    AppDelegate appDelegate;
    appDelegate.applicationDidFinishLaunchingWithOptions(Dict{});

    // Creation order: the client's shared instance, then the store's (which listens and then
    // becomes the delegate), then the start-up sequence once the root view has loaded.
    RootNavigationController root;
    // The charts' history, fed by the store on every stored arrival.
    root.myMetricValidator->setHistory(std::make_shared<History>());
    drive->setStore(root.myMetricValidator);

    int status = 0;
#ifdef PYXON_HAVE_WINDOW
    if (window) {
        WindowOptions windowOptions;
        windowOptions.screenshotDir = options.screenshots;
        windowOptions.chart = chart;
        windowOptions.drive = drive;
        status = runWindow(argc, argv, windowOptions, [&root] { root.viewDidLoad(); });
    } else {
        status = runHeadless(root);
    }
#else
    status = runHeadless(root);
#endif
    appDelegate.applicationWillTerminate();
    source->close();
    return status;
}

}  // namespace pyx
