#include "tools/ListenCommand.h"

#include <atomic>
#include <csignal>
#include <cstdio>
#include <iostream>
#include <memory>
#include <optional>
#include <stop_token>
#include <string>
#include <thread>

#include "app/Bundle.h"
#include "app/ProgramSource.h"
#include "app/RootNavigationController.h"
#include "app/StopOnSignal.h"
#include "baseband/VelkWrapper.h"
#include "baseband/VelkWrapperDelegate.h"
#include "core/Log.h"
#include "core/MainQueue.h"
#include "sources/Source.h"
#include "tools/RecordWriter.h"

namespace pyx {
namespace {

struct ListenOptions {
    SourceArgs source;
    std::optional<double> duration;
    std::optional<std::uint64_t> count;
};

// Receives the client's events on the main queue and prints the metric ones.
class EventPrinter : public VelkWrapperDelegate {
  public:
    EventPrinter(MainQueue& queue, std::optional<std::uint64_t> count)
        : queue_(queue), count_(count) {}

    void metricsDidUpdate(const MetricRecord& record) override {
        if (done_) return;
        std::string line = recordLine(record);
        line += '\n';
        // A reader that went away (a closed pipe) ends the run like a signal would.
        if (std::fwrite(line.data(), 1, line.size(), stdout) != line.size() ||
            std::fflush(stdout) != 0) {
            finish();
            return;
        }
        if (count_ && ++printed_ >= *count_) finish();
    }
    void eventsDidUpdate(const MetricRecord&) override {}

  private:
    void finish() {
        done_ = true;
        queue_.stop();
    }

    MainQueue& queue_;
    const std::optional<std::uint64_t> count_;
    std::uint64_t printed_ = 0;
    bool done_ = false;
};

int runListen(const ListenOptions& options) {
    // stdout carries only records; the start-up lines go to stderr.
    standardOutputSink().redirect(stderr);
    std::signal(SIGPIPE, SIG_IGN);

    MainQueue& mainQueue = MainQueue::shared();
    mainQueue.claimCurrentThread();
    const StopOnSignal stopOnSignal([&mainQueue] { mainQueue.stop(); });

    // Set on the replay's thread, read once the main queue has stopped.
    std::atomic<bool> damaged{false};
    std::optional<ProgramSource> source;
    try {
        // A replay that ends ends the run, once the events before the end are printed: the
        // stop goes the way the events go, through the serial queue, then the main queue.
        source.emplace(openProgramSource(
            options.source, PYXON_VERSION, [&mainQueue, &damaged](bool isDamaged) {
                if (isDamaged) damaged = true;
                VelkWrapper::queue().post(
                    [&mainQueue] { mainQueue.post([&mainQueue] { mainQueue.stop(); }); });
            }));
    } catch (const sources::SourceError& e) {
        std::cerr << "pyxonctl listen: " << e.what() << "\n";
        return 2;
    }

    const auto printer = std::make_shared<EventPrinter>(mainQueue, options.count);
    const auto client = VelkWrapper::create(mainQueue);
    client->setDelegate(printer);
    RootNavigationController root(client, nullptr, Bundle::mainBundle());
    root.viewDidLoad();

    std::jthread timer;
    if (options.duration) {
        timer = std::jthread([&mainQueue, seconds = *options.duration](std::stop_token stop) {
            std::mutex mutex;
            std::condition_variable_any wake;
            std::unique_lock lock(mutex);
            const auto until =
                std::chrono::steady_clock::now() + std::chrono::duration<double>(seconds);
            if (!wake.wait_until(lock, stop, until, [] { return false; })) mainQueue.stop();
        });
    }
    mainQueue.run();
    client->setDelegate({});
    source->close();
    return damaged ? 1 : 0;
}

}  // namespace

Subcommand addListenCommand(CLI::App& pyxonctl) {
    auto options = std::make_shared<ListenOptions>();
    CLI::App* listen = pyxonctl.add_subcommand(
        "listen",
        "Start a source the way the viewer does and print every metric event as one JSON line "
        "({\"kKeyMetricID\": N, \"kKeyPayload\": \"hex\"}), the format decode and screen read");
    options->source.addTo(*listen);
    listen->add_option("--duration", options->duration, "Stop after this many seconds")
        ->type_name("SECONDS")
        ->check(CLI::NonNegativeNumber);
    listen->add_option("--count", options->count, "Stop after this many metric events")
        ->type_name("N")
        ->check(CLI::PositiveNumber);
    listen->footer(
        std::string(sources::sourceHelp()) + "\n" + std::string(sources::recordingHelp()) +
        "\nWithout --duration or --count it runs until SIGINT or SIGTERM, or until a replay\n"
        "without --loop reaches the end of its recording (a diag capture the end of the\n"
        "capture); it exits 0, or 1 when the recording turns out damaged (what was read before\n"
        "the damage is printed).\n"
        "Examples:\n"
        "  pyxonctl listen --speed 20 --count 100 > drive.jsonl\n"
        "  pyxonctl listen --source modem --duration 10 | pyxonctl screen LTE \"Serving "
        "Cell Meas\"\n"
        "  pyxonctl listen --source modem --duration 3600 --record drive.pyxrec > "
        "/dev/null\n"
        "  pyxonctl listen --source replay:drive.pyxrec --speed 0 | pyxonctl decode\n"
        "  pyxonctl listen --source diag:drive.qmdl --speed 0 | pyxonctl screen UMTS \"Serving "
        "Cell Info\"\n"
        "  pyxonctl listen --source diag --qmdl drive.qmdl --record drive.pyxrec > /dev/null\n");
    return Subcommand{listen, [options] { return runListen(*options); }};
}

}  // namespace pyx
