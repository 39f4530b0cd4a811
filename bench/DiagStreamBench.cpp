// The DIAG stream on the captures of ../shared/diag/captures (read at run time): each capture
// deframed, unwrapped and decoded on one core, as a replay reads it (64 KiB pieces), and all of
// them back to back; the deframer alone on all of them for comparison. Reports bytes/s and
// packets/s (good frames). Without the captures it says so and measures nothing.
//
// Names: "diag/stream/<capture>", "diag/stream/all", "diag/deframe/all"; bench/run prints them.
// Usage: pyxon_diag_bench [--captures=DIR] [Google Benchmark options]
#include <benchmark/benchmark.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <iterator>
#include <string>
#include <vector>

#include "sources/diag/stream/DiagStream.h"

namespace {

namespace fs = std::filesystem;
using pyx::Bytes;

constexpr std::size_t kPiece = 64 * 1024;

struct Capture {
    std::string name;
    Bytes bytes;
};

std::vector<Capture> loadCaptures(const fs::path& dir) {
    std::vector<Capture> captures;
    for (const auto& entry : fs::directory_iterator(dir)) {
        const std::string ext = entry.path().extension().string();
        if (ext != ".mi2log" && ext != ".qmdl") continue;
        std::ifstream in(entry.path(), std::ios::binary);
        captures.push_back({entry.path().stem().string(), Bytes{std::istreambuf_iterator<char>(in),
                                                                std::istreambuf_iterator<char>()}});
    }
    std::sort(captures.begin(), captures.end(),
              [](const Capture& a, const Capture& b) { return a.name < b.name; });
    return captures;
}

template <typename Feed>
void feedInPieces(const Bytes& bytes, Feed&& feed) {
    for (std::size_t at = 0; at < bytes.size(); at += kPiece)
        feed(std::span<const std::uint8_t>(bytes).subspan(at, std::min(kPiece, bytes.size() - at)));
}

// Deframed and decoded: bytes and good frames per second, and the events written.
void streamBench(benchmark::State& state, const std::vector<const Capture*>& captures) {
    std::uint64_t bytes = 0, frames = 0, events = 0;
    for (auto _ : state) {
        for (const Capture* capture : captures) {
            pyx::diag::DiagStream diag;
            feedInPieces(capture->bytes, [&](std::span<const std::uint8_t> piece) {
                diag.feed(piece, [&](pyx::diag::DecodedPacket& p) { events += p.events.size(); });
            });
            diag.finish();
            bytes += capture->bytes.size();
            frames += diag.stats().frames.frames;
        }
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(bytes));
    state.SetItemsProcessed(static_cast<std::int64_t>(frames));
    state.counters["events"] =
        benchmark::Counter(static_cast<double>(events), benchmark::Counter::kIsRate);
}

// The deframer alone: bytes and good frames per second.
void deframeBench(benchmark::State& state, const std::vector<const Capture*>& captures) {
    std::uint64_t bytes = 0, frames = 0, sum = 0;
    for (auto _ : state) {
        for (const Capture* capture : captures) {
            pyx::diag::Deframer deframer;
            feedInPieces(capture->bytes, [&](std::span<const std::uint8_t> piece) {
                deframer.feed(piece, [&](std::span<const std::uint8_t> p) { sum += p[0]; });
            });
            bytes += capture->bytes.size();
            frames += deframer.counts().frames;
        }
    }
    benchmark::DoNotOptimize(sum);
    state.SetBytesProcessed(static_cast<std::int64_t>(bytes));
    state.SetItemsProcessed(static_cast<std::int64_t>(frames));
}

}  // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    fs::path dir = fs::path(PYXON_SHARED_DIAG) / "captures";
    constexpr std::string_view kCapturesFlag = "--captures=";
    for (int i = 1; i < argc; ++i) {
        const std::string_view arg(argv[i]);
        if (arg.starts_with(kCapturesFlag)) {
            dir = std::string(arg.substr(kCapturesFlag.size()));
        } else {
            std::cerr << "pyxon_diag_bench: unknown option " << arg << "\n";
            return 2;
        }
    }
    if (!fs::is_directory(dir)) {
        std::cerr << "pyxon_diag_bench: skipped: " << dir.string() << " not present\n";
        return 0;
    }
    const std::vector<Capture> captures = loadCaptures(dir);
    std::vector<const Capture*> all;
    for (const Capture& c : captures) {
        all.push_back(&c);
        benchmark::RegisterBenchmark(("diag/stream/" + c.name).c_str(), streamBench,
                                     std::vector<const Capture*>{&c})
            ->Unit(benchmark::kMillisecond);
    }
    benchmark::RegisterBenchmark("diag/stream/all", streamBench, all)
        ->Unit(benchmark::kMillisecond);
    benchmark::RegisterBenchmark("diag/deframe/all", deframeBench, all)
        ->Unit(benchmark::kMillisecond);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
