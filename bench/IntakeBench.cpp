// The store's side: a record taken by the intake, the charts' history fed as in a long run, an
// event carried from the manager's serial queue to the store, and a category screen answered in
// full.
#include <benchmark/benchmark.h>

#include <atomic>
#include <cstdint>
#include <exception>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <thread>

#include "baseband/VelkWrapper.h"
#include "baseband/velk/Client.h"
#include "baseband/velk/Names.h"
#include "baseband/velk/Transport.h"
#include "bench/Registration.h"
#include "core/Log.h"
#include "core/MainQueue.h"
#include "metrics/MetricCatalogue.h"
#include "metrics/MetricValidator.h"
#include "metrics/history/History.h"
#include "ui/PyxViewItems.h"
#include "ui/SecondLevelViewController.h"

namespace pyx::bench {

namespace {

// Both line sinks swallow their lines while it lives; standard output lines go to onLine.
class SilencedSinks {
  public:
    explicit SilencedSinks(LineSink::Writer onLine = [](std::string_view) {}) {
        standardOutputSink().intercept(std::move(onLine));
        systemLogSink().intercept([](std::string_view) {});
    }
    ~SilencedSinks() {
        standardOutputSink().intercept({});
        systemLogSink().intercept({});
    }
    SilencedSinks(const SilencedSinks&) = delete;
    SilencedSinks& operator=(const SilencedSinks&) = delete;
};

void account(benchmark::State& state, const Subject& subject) {
    std::int64_t bytes = 0;
    for (const CorpusRecord* r : subject.records)
        bytes += static_cast<std::int64_t>(r->payload.size());
    state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(subject.records.size()));
    state.SetBytesProcessed(state.iterations() * bytes);
    state.counters["bytes_per_msg"] =
        static_cast<double>(bytes) / static_cast<double>(subject.records.size());
}

// Both line sinks muted while it lives, as in pyxonctl without -v: no line is built.
class MutedSinks {
  public:
    MutedSinks() {
        standardOutputSink().mute(true);
        systemLogSink().mute(true);
    }
    ~MutedSinks() {
        standardOutputSink().mute(false);
        systemLogSink().mute(false);
    }
    MutedSinks(const MutedSinks&) = delete;
    MutedSinks& operator=(const MutedSinks&) = delete;
};

// What the intake's lines cost is part of "intake/ours/..." and out of "intake/quiet/...".
enum class IntakeMode {
    Read,     // "ours": the lines are built and taken (the window, --headless)
    Quiet,    // "quiet": the sinks muted, nobody reads the lines (pyxonctl without -v)
    History,  // "history": as ours, and the store feeds the charts' history
};

// Record to stored dictionary: dispatch, decode, dictionary, timestamp text, conversions,
// holders and the arrival line, on a store of its own; as "intake/history/..." the store also
// feeds the charts' history, to compare with "intake/ours/...". (The corpus replays the same
// times on every pass, so the history starts a new session at each pass, as for a replay: its
// series stay nearly empty. "history/ours/..." measures it full.)
void registerIntake(const Subject& subject, IntakeMode mode) {
    const char* const side = mode == IntakeMode::Read    ? "ours"
                             : mode == IntakeMode::Quiet ? "quiet"
                                                         : "history";
    benchmark::RegisterBenchmark(
        ("intake/" + std::string(side) + "/" + subject.name).c_str(),
        [subject, mode](benchmark::State& state) {
            const SilencedSinks silenced;
            std::optional<MutedSinks> muted;
            if (mode == IntakeMode::Quiet) muted.emplace();
            const auto validator = MetricValidator::create(nullptr);
            if (mode == IntakeMode::History) validator->setHistory(std::make_shared<History>());
            for (auto _ : state) {
                for (const CorpusRecord* r : subject.records) {
                    if (!validator->isMetricIDValidWithMetricdict(r->record)) {
                        state.SkipWithError("a record was not taken");
                        return;
                    }
                }
            }
            account(state, subject);
        });
}

// The history alone as it runs for hours: History::record on the stored dictionaries of the
// subject's records (decoded once), one record a second of simulated time that keeps going
// forward, after a warm-up longer than the history's window. Every ring is full, so each new
// slot takes the place of the oldest, and neighbours that come and go recycle series.
void registerHistory(const Subject& subject) {
    struct Arrival {
        MetricValidator::DictionaryProperty property;
        Dict stored;
    };
    std::vector<Arrival> arrivals;
    {
        const SilencedSinks silenced;
        const auto validator = MetricValidator::create(nullptr);
        for (const CorpusRecord* r : subject.records) {
            if (!validator->isMetricIDValidWithMetricdict(r->record)) continue;
            const MetricKind* kind = findMetricKind(r->metricID);
            if (kind == nullptr || !kind->property) continue;
            if (const auto& stored = validator->dictionary(*kind->property))
                arrivals.push_back(Arrival{*kind->property, *stored});
        }
    }
    if (arrivals.empty()) return;
    benchmark::RegisterBenchmark(
        ("history/ours/" + subject.name).c_str(), [arrivals](benchmark::State& state) {
            constexpr double kStepMs = 1000;
            History history;
            double timeMs = 1'717'200'000'000.0;  // 2024-06-01 00:00:00 UTC
            const double warmedUpMs = timeMs + history.limits().windowMs + 10 * 60'000.0;
            while (timeMs < warmedUpMs) {
                for (const Arrival& a : arrivals) {
                    history.record(a.property, a.stored, timeMs);
                    timeMs += kStepMs;
                }
            }
            for (auto _ : state) {
                for (const Arrival& a : arrivals) {
                    history.record(a.property, a.stored, timeMs);
                    timeMs += kStepMs;
                }
            }
            state.SetItemsProcessed(state.iterations() *
                                    static_cast<std::int64_t>(arrivals.size()));
            state.counters["series"] = static_cast<double>(history.seriesCount());
        });
}

// A transport that hands the events it is given to the manager, as the baseband service would.
class CorpusTransport : public velk::client::Transport {
  public:
    velk::Result performCommand(const std::string&, const Value&, Value*) override {
        return velk::Result(velk::kCodeSuccess, "");
    }
    void startEvents(EventSink sink) override {
        const std::lock_guard lock(mutex_);
        sink_ = std::move(sink);
    }
    void stopEvents() override {
        const std::lock_guard lock(mutex_);
        sink_ = nullptr;
    }
    // The object is copied, as a conversion from the service's own form would make it.
    bool emit(const Value& object) {
        const std::lock_guard lock(mutex_);
        if (!sink_) return false;
        sink_(velk::kEventMetric, object);
        return true;
    }

  private:
    std::mutex mutex_;
    EventSink sink_;
};

// Serial queue to store: the transport pushes every corpus event through the velk manager and
// VelkWrapper (event conversion, its log line, the hop to the main queue) to a MetricValidator;
// this thread drains the main queue until every event is stored.
void registerPath(const Subject& subject) {
    // Two threads do the work: measured in wall-clock time.
    benchmark::RegisterBenchmark(("path/ours/" + subject.name).c_str(), [subject](benchmark::State&
                                                                                      state) {
        std::vector<Value> events;
        for (const CorpusRecord* r : subject.records) {
            Dict event;
            event.append(velk::kKeyMetricID, Value(r->metricID));
            event.append(velk::kKeyPayload, Value(r->payload));
            event.append(velk::kKeyPayloadType, Value(std::int64_t{0}));
            event.append(velk::kKeyProfileID, Value(std::int64_t{0}));
            events.emplace_back(std::move(event));
        }
        std::atomic<std::int64_t> stored{0};
        const SilencedSinks silenced([&stored](std::string_view line) {
            if (line == "Received Valid Metric") stored.fetch_add(1, std::memory_order_relaxed);
        });

        MainQueue mainQueue;
        mainQueue.claimCurrentThread();
        std::exception_ptr failure;
        mainQueue.setErrorHandler([&failure](std::exception_ptr e) { failure = e; });
        const auto transport = std::make_shared<CorpusTransport>();
        velk::client::SetTransportFactory([transport] { return transport; });
        const auto client = VelkWrapper::create(mainQueue);
        velk::client::SetTransportFactory({});
        const auto validator = MetricValidator::create(client);

        std::int64_t target = 0;
        for (auto _ : state) {
            for (const Value& event : events) transport->emit(event);
            target += static_cast<std::int64_t>(events.size());
            while (stored.load(std::memory_order_relaxed) < target && !failure) {
                if (mainQueue.drain() == 0) std::this_thread::yield();
            }
            if (failure) {
                state.SkipWithError("the store refused an event");
                break;
            }
        }
        account(state, subject);
    })->UseRealTime();
}

// Every cell of one category screen, as the table asks for them on a reload.
std::int64_t answerInFull(const SecondLevelViewController& screen) {
    std::int64_t cells = 0;
    const int sections = screen.numberOfSections();
    for (int s = 0; s < sections; ++s) {
        benchmark::DoNotOptimize(screen.titleForHeaderInSection(s));
        const int rows = screen.numberOfRowsInSection(s);
        for (int row = 0; row < rows; ++row) {
            benchmark::DoNotOptimize(screen.cellForRowAtIndexPath(s, row));
            ++cells;
        }
    }
    return cells;
}

// The category screen with the most cells once the whole corpus is stored (the large records
// come last, so their lists are the ones kept).
void registerScreen(const std::vector<CorpusRecord>& corpus) {
    const SilencedSinks silenced;
    const auto validator = MetricValidator::create(nullptr);
    for (const CorpusRecord& r : corpus) validator->isMetricIDValidWithMetricdict(r.record);

    const PyxViewItems items = makePyxViewItems();
    std::shared_ptr<SecondLevelViewController> largest;
    std::int64_t largestCells = -1;
    for (const std::string& group : items.launchViewItemNames) {
        const auto categories = items.firstLevelViewItems.find(group);
        if (categories == items.firstLevelViewItems.end()) continue;
        for (const std::string& category : categories->second) {
            auto screen = std::make_shared<SecondLevelViewController>(*validator);
            screen->setFirstSelection(group);
            screen->setSeguedThroughRow(category);
            const std::int64_t cells = answerInFull(*screen);
            if (cells > largestCells) {
                largestCells = cells;
                largest = std::move(screen);
            }
        }
    }
    if (!largest) return;
    const std::string name =
        "screen/ours/" + largest->categoryKey() + " (" + std::to_string(largestCells) + " cells)";
    benchmark::RegisterBenchmark(name.c_str(), [largest, validator](benchmark::State& state) {
        const SilencedSinks silencedWhileMeasured;
        std::int64_t cells = 0;
        for (auto _ : state) cells += answerInFull(*largest);
        state.SetItemsProcessed(cells);
        state.counters["cells"] =
            static_cast<double>(cells) / static_cast<double>(state.iterations());
    });
}

}  // namespace

void registerIntakeBenchmarks(const std::vector<CorpusRecord>& corpus) {
    const std::vector<Subject> subjects = subjectsOf(corpus);
    for (const Subject& subject : subjects) registerIntake(subject, IntakeMode::Read);
    // Quiet and with the history: the realistic mix and the whole corpus (the last two
    // subjects).
    for (std::size_t i = subjects.size() >= 2 ? subjects.size() - 2 : 0; i < subjects.size(); ++i) {
        registerIntake(subjects[i], IntakeMode::Quiet);
        registerIntake(subjects[i], IntakeMode::History);
        registerHistory(subjects[i]);
    }
    registerPath(subjects.back());  // the whole corpus
    registerScreen(corpus);
}

}  // namespace pyx::bench
