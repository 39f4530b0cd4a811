// Recordings: events written through the writer thread, a recording exported as JSON Lines,
// and a recording replayed as fast as it goes, to nothing (the file's share) and through the
// client to the store (the whole path). All measured in wall-clock time: a thread of the
// recording does part of the work.
#include <benchmark/benchmark.h>

#include <atomic>
#include <cstdlib>
#include <filesystem>
#include <memory>
#include <ostream>
#include <streambuf>
#include <string>
#include <thread>

#include "baseband/VelkWrapper.h"
#include "baseband/velk/Client.h"
#include "baseband/velk/Names.h"
#include "bench/Registration.h"
#include "core/Log.h"
#include "core/MainQueue.h"
#include "metrics/MetricValidator.h"
#include "recordings/RecordingWriter.h"
#include "sources/replay/ReplayTransport.h"
#include "tools/ExportCommand.h"

namespace pyx::bench {
namespace {

using recordings::RecordingWriter;

constexpr std::int64_t kEventsPerRecording = 200'000;

// Every line sink swallows its lines while it lives.
class QuietSinks {
  public:
    QuietSinks() {
        standardOutputSink().intercept([](std::string_view) {});
        systemLogSink().intercept([](std::string_view) {});
    }
    ~QuietSinks() {
        standardOutputSink().intercept({});
        systemLogSink().intercept({});
    }
    QuietSinks(const QuietSinks&) = delete;
    QuietSinks& operator=(const QuietSinks&) = delete;
};

// Output that goes nowhere, as to /dev/null without the system calls.
class NullBuffer : public std::streambuf {
  protected:
    std::streamsize xsputn(const char*, std::streamsize n) override { return n; }
    int_type overflow(int_type c) override { return traits_type::not_eof(c); }
};

// A folder of the benchmark's own, removed at the end.
class Scratch {
  public:
    Scratch() {
        std::string pattern =
            (std::filesystem::temp_directory_path() / "pyxon-bench-XXXXXX").string();
        path_ = ::mkdtemp(pattern.data());
    }
    ~Scratch() {
        std::error_code ignored;
        std::filesystem::remove_all(path_, ignored);
    }
    Scratch(const Scratch&) = delete;
    Scratch& operator=(const Scratch&) = delete;
    [[nodiscard]] std::string file(const std::string& name) const {
        return (path_ / name).string();
    }

  private:
    std::filesystem::path path_;
};

// The corpus as event objects, as a baseband hands them to the client.
std::vector<Value> eventsOf(const std::vector<CorpusRecord>& corpus) {
    std::vector<Value> events;
    for (const CorpusRecord& r : corpus) {
        Dict event;
        event.append(velk::kKeyMetricID, Value(r.metricID));
        event.append(velk::kKeyPayload, Value(r.payload));
        event.append(velk::kKeyPayloadType, Value(std::int64_t{0}));
        event.append(velk::kKeyProfileID, Value(std::int64_t{0}));
        events.emplace_back(std::move(event));
    }
    return events;
}

RecordingWriter::Options writerOptions(const std::string& file) {
    RecordingWriter::Options options;
    options.path = file;
    options.session.programVersion = "bench";
    options.session.source = "bench";
    options.session.host = "bench";
    options.queueCapacity = 1 << 20;
    return options;
}

// A recording of kEventsPerRecording corpus events, cycling through the corpus.
void writeRecording(const std::string& file, const std::vector<Value>& events) {
    std::filesystem::remove(file);
    recordings::RecordingWriter writer(writerOptions(file));
    for (std::int64_t n = 0; n < kEventsPerRecording; ++n)
        writer.add(velk::kEventMetric, events[static_cast<std::size_t>(n) % events.size()]);
    writer.close();
}

}  // namespace

void registerRecordingBenchmarks(const std::vector<CorpusRecord>& corpus) {
    const auto events = std::make_shared<const std::vector<Value>>(eventsOf(corpus));
    const auto scratch = std::make_shared<Scratch>();

    // add() on the calling thread, inserts and commits on the writer thread, until all are in
    // the file (close waits for that).
    benchmark::RegisterBenchmark(
        "recording/write",
        [events, scratch](benchmark::State& state) {
            const QuietSinks quiet;
            const std::string file = scratch->file("write.pyxrec");
            std::uint64_t dropped = 0;
            for (auto _ : state) {
                state.PauseTiming();
                std::filesystem::remove(file);
                std::filesystem::remove(file + "-wal");
                state.ResumeTiming();
                RecordingWriter writer(writerOptions(file));
                for (std::int64_t n = 0; n < kEventsPerRecording; ++n)
                    writer.add(velk::kEventMetric,
                               (*events)[static_cast<std::size_t>(n) % events->size()]);
                writer.close();
                dropped += writer.counts().dropped;
            }
            if (dropped > 0) state.SkipWithError("events were dropped");
            state.SetItemsProcessed(state.iterations() * kEventsPerRecording);
        })
        ->UseRealTime()
        ->Unit(benchmark::kMillisecond);

    benchmark::RegisterBenchmark(
        "recording/export_jsonl",
        [events, scratch](benchmark::State& state) {
            const QuietSinks quiet;
            const std::string file = scratch->file("export.pyxrec");
            writeRecording(file, *events);
            NullBuffer nothing;
            std::ostream out(&nothing);
            std::ostream err(&nothing);
            ExportRequest request;
            request.file = file;
            for (auto _ : state) {
                if (runExport(request, out, err) != 0) state.SkipWithError("export failed");
            }
            state.SetItemsProcessed(state.iterations() * kEventsPerRecording);
        })
        ->UseRealTime()
        ->Unit(benchmark::kMillisecond);

    // The file's share of a replay: read, decode the stored events and hand them to a sink
    // that does nothing.
    benchmark::RegisterBenchmark(
        "recording/replay_to_nothing",
        [events, scratch](benchmark::State& state) {
            const QuietSinks quiet;
            const std::string file = scratch->file("replay.pyxrec");
            writeRecording(file, *events);
            for (auto _ : state) {
                replay::ReplayTransport::Options options;
                options.file = file;
                options.speed = 0;
                replay::ReplayTransport transport(options);
                transport.performCommand(velk::kCommandAddConfiguration, Value(), nullptr);
                transport.startEvents([](const std::string&, Value) {});
                while (!transport.finished())
                    std::this_thread::sleep_for(std::chrono::microseconds(200));
            }
            state.SetItemsProcessed(state.iterations() * kEventsPerRecording);
        })
        ->UseRealTime()
        ->Unit(benchmark::kMillisecond);

    // A replay as pyxon runs it: the client's serial queue, the main queue (drained here) and
    // the store, with the replay waiting on the backlog.
    benchmark::RegisterBenchmark(
        "recording/replay_to_store",
        [events, scratch](benchmark::State& state) {
            std::atomic<std::int64_t> stored{0};
            const QuietSinks quiet;
            standardOutputSink().intercept([&stored](std::string_view line) {
                if (line == "Received Valid Metric") stored.fetch_add(1, std::memory_order_relaxed);
            });
            const std::string file = scratch->file("replay.pyxrec");
            writeRecording(file, *events);
            MainQueue mainQueue;
            mainQueue.claimCurrentThread();
            std::int64_t target = 0;
            for (auto _ : state) {
                replay::ReplayTransport::Options options;
                options.file = file;
                options.speed = 0;
                options.backlog = [&mainQueue] {
                    return mainQueue.pending() + VelkWrapper::queue().pending();
                };
                const auto transport = std::make_shared<replay::ReplayTransport>(options);
                velk::client::SetTransportFactory([transport] { return transport; });
                auto client = VelkWrapper::create(mainQueue);
                velk::client::SetTransportFactory({});
                const auto validator = MetricValidator::create(client);
                client->addTelxConfigForAppId("pyxtool", "/dev/null");
                client->listen();
                target += kEventsPerRecording;
                while (stored.load(std::memory_order_relaxed) < target) {
                    if (mainQueue.drain() == 0) std::this_thread::yield();
                }
                client.reset();
            }
            state.SetItemsProcessed(state.iterations() * kEventsPerRecording);
        })
        ->UseRealTime()
        ->Unit(benchmark::kMillisecond);
}

}  // namespace pyx::bench
