#include "app/Application.h"

#include <CLI/CLI.hpp>

#include <atomic>
#include <csignal>
#include <cstdint>
#include <iostream>
#include <optional>
#include <string>
#include <thread>

#include "app/AppDelegate.h"
#include "app/RejectedRecords.h"
#include "app/RootNavigationController.h"
#include "app/StopOnSignal.h"
#include "baseband/VelkWrapper.h"
#include "baseband/velk/Client.h"
#include "core/Format.h"
#include "core/Log.h"
#include "core/MainQueue.h"
#include "metrics/MetricValidator.h"
#include "sources/Source.h"
#ifdef PYXON_HAVE_WINDOW
#include "ui/qt/QtFrontEnd.h"
#endif

namespace pyx {
namespace {

struct Options {
    bool headless = false;
    std::string source = "sim";
    std::uint64_t seed = 1;
    double speed = 1.0;
    std::optional<std::string> screenshots;
};

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
        "simulated baseband or a real modem through ModemManager.",
        "pyxon"};
    Options options;
    cli.add_flag("--headless", options.headless,
                 "No window: print the system's lines as events arrive, until SIGINT or SIGTERM");
    cli.add_option("--source", options.source,
                   "Where events come from: sim, modem, modem:N or replay:FILE (see below)")
        ->type_name("SPEC")
        ->capture_default_str();
    cli.add_option("--seed", options.seed, "Seed of the simulated baseband's drive")
        ->capture_default_str();
    cli.add_option("--speed", options.speed,
                   "Speed factor of the simulated baseband (2 = events twice as often)")
        ->check(CLI::PositiveNumber)
        ->capture_default_str();
    cli.add_option("--screenshots", options.screenshots,
                   "Render every screen to PNG files in this folder, then quit")
        ->type_name("DIR");
    cli.set_version_flag("--version", std::string("pyxon ") + PYXON_VERSION);
    cli.footer(std::string(sources::sourceHelp()) +
               "\nExamples:\n"
               "  pyxon --headless --speed 20\n"
               "  pyxon --source modem\n");
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
    std::optional<sources::SourceSpec> sourceSpec;
    try {
        sourceSpec = sources::parseSourceSpec(options.source);
    } catch (const sources::SourceSpecError& e) {
        std::cerr << "pyxon: " << e.what() << "\n";
        return 2;
    }

#ifdef PYXON_HAVE_WINDOW
    const bool window = !options.headless && (options.screenshots || displayAvailable());
    if (!options.headless && !window) systemLog("pyxon: no display available, running headless");
#else
    const bool window = false;
    if (!options.headless) systemLog("pyxon: built without the window, running headless");
#endif
    if (options.screenshots && !window) {
        std::cerr << "pyxon: --screenshots needs the window\n";
        return 2;
    }

    std::optional<StopOnSignal> stopOnSignal;
    if (!window) stopOnSignal.emplace(MainQueue::shared());

    const RejectedRecords rejected(MainQueue::shared());

    std::shared_ptr<velk::client::Transport> transport;
    try {
        transport = sources::makeTransport(
            sources::SourceOptions{*sourceSpec, options.seed, options.speed, false});
    } catch (const sources::SourceSpecError& e) {
        std::cerr << "pyxon: " << e.what() << "\n";
        return 2;
    }
    velk::client::SetTransportFactory([transport] { return transport; });

    AppDelegate appDelegate;
    appDelegate.applicationDidFinishLaunchingWithOptions(Dict{});

    // Creation order: the client's shared instance, then the store's (which listens and then
    // becomes the delegate), then the start-up sequence once the root view has loaded.
    RootNavigationController root;

    int status = 0;
#ifdef PYXON_HAVE_WINDOW
    if (window) {
        WindowOptions windowOptions;
        windowOptions.screenshotDir = options.screenshots;
        status = runWindow(argc, argv, windowOptions, [&root] { root.viewDidLoad(); });
    } else {
        status = runHeadless(root);
    }
#else
    status = runHeadless(root);
#endif
    appDelegate.applicationWillTerminate();
    return status;
}

}  // namespace pyx
