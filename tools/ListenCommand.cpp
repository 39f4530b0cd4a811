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
    std::string source = "sim";
    std::uint64_t seed = 1;
    double speed = 1.0;
    bool loop = false;
    std::optional<std::string> record;
    bool append = false;
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
    std::optional<sources::SourceChoice> choice;
    try {
        choice = sources::parseSource(options.source);
    } catch (const sources::SourceError& e) {
        std::cerr << "pyxonctl listen: " << e.what() << "\n";
        return 2;
    }
    // stdout carries only records; the start-up lines go to stderr.
    standardOutputSink().redirect(stderr);
    std::signal(SIGPIPE, SIG_IGN);

    MainQueue& mainQueue = MainQueue::shared();
    mainQueue.claimCurrentThread();
    const StopOnSignal stopOnSignal(mainQueue);

    // Set on the replay's thread, read once the main queue has stopped.
    std::atomic<bool> damaged{false};
    std::optional<ProgramSource> source;
    try {
        sources::SourceOptions sourceOptions;
        sourceOptions.choice = *choice;
        sourceOptions.seed = options.seed;
        sourceOptions.speed = options.speed;
        sourceOptions.loop = options.loop;
        // A replay that ends ends the run, once the events before the end are printed: the
        // stop goes the way the events go, through the serial queue, then the main queue.
        sourceOptions.onEnd = [&mainQueue, &damaged](bool isDamaged) {
            if (isDamaged) damaged = true;
            VelkWrapper::queue().post(
                [&mainQueue] { mainQueue.post([&mainQueue] { mainQueue.stop(); }); });
        };
        source.emplace(openProgramSource(std::move(sourceOptions), options.record, options.append,
                                         PYXON_VERSION));
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
    listen->add_option("--source", options->source, "sim, modem, modem:N or replay:FILE")
        ->type_name("SOURCE")
        ->capture_default_str();
    listen->add_option("--seed", options->seed, "Seed of the simulated baseband's drive")
        ->capture_default_str();
    listen
        ->add_option("--speed", options->speed,
                     "Speed factor: the simulated baseband's events come this many times as "
                     "often (> 0); a replay divides the recorded timing by it (0 = as fast as "
                     "they are taken)")
        ->check(CLI::NonNegativeNumber)
        ->capture_default_str();
    listen->add_flag("--loop", options->loop, "Replay: start again at the end of the recording");
    CLI::Option* record =
        listen
            ->add_option("--record", options->record,
                         "Keep every event of this run in FILE (.pyxrec), raw and in order")
            ->type_name("FILE");
    listen
        ->add_flag("--append", options->append,
                   "With --record: add a new session to an existing recording")
        ->needs(record);
    listen->add_option("--duration", options->duration, "Stop after this many seconds")
        ->type_name("SECONDS")
        ->check(CLI::NonNegativeNumber);
    listen->add_option("--count", options->count, "Stop after this many metric events")
        ->type_name("N")
        ->check(CLI::PositiveNumber);
    listen->footer(
        std::string(sources::sourceHelp()) + "\n" + std::string(sources::recordingHelp()) +
        "\nWithout --duration or --count it runs until SIGINT or SIGTERM, or until a replay\n"
        "without --loop reaches the end of its recording; it exits 0, or 1 when the recording\n"
        "turns out damaged (what was read before the damage is printed).\n"
        "Examples:\n"
        "  pyxonctl listen --speed 20 --count 100 > drive.jsonl\n"
        "  pyxonctl listen --source modem --duration 10 | pyxonctl screen LTE \"Serving "
        "Cell Meas\"\n"
        "  pyxonctl listen --source modem --duration 3600 --record drive.pyxrec > "
        "/dev/null\n"
        "  pyxonctl listen --source replay:drive.pyxrec --speed 0 | pyxonctl decode\n");
    return Subcommand{listen, [options] { return runListen(*options); }};
}

}  // namespace pyx
