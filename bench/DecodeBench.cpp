// Decode time per message for one realistic payload of every decoded metric kind: the typed
// decode alone, and the whole path from bytes to the dictionary the store keeps. The payload
// of each kind is the largest of its realistic records in the corpus, which the simulated
// baseband's payload writers wrote.
#include <benchmark/benchmark.h>

#include <cstdint>
#include <string>

#include "bench/BenchKinds.h"
#include "bench/Registration.h"

namespace pyx::bench {

namespace {

// The largest realistic record of metricID, or nullptr when the corpus has none.
const CorpusRecord* sampleOf(const std::vector<CorpusRecord>& corpus, std::int64_t metricID) {
    const CorpusRecord* sample = nullptr;
    for (const CorpusRecord& r : corpus) {
        if (r.large || r.metricID != metricID) continue;
        if (sample == nullptr || r.payload.size() > sample->payload.size()) sample = &r;
    }
    return sample;
}

void account(benchmark::State& state, const CorpusRecord& sample) {
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) *
                            static_cast<std::int64_t>(sample.payload.size()));
    state.counters["payload_bytes"] = static_cast<double>(sample.payload.size());
}

}  // namespace

void registerDecodeBenchmarks(const std::vector<CorpusRecord>& corpus) {
    for (const BenchKind& kind : benchKinds()) {
        const CorpusRecord* sample = sampleOf(corpus, kind.metricID);
        if (sample == nullptr) continue;
        const std::string name(kind.messageClass);
        benchmark::RegisterBenchmark(("BM_Decode<" + name + ">").c_str(),
                                     [&kind, sample](benchmark::State& state) {
                                         for (auto _ : state) {
                                             const bool read = kind.oursDecode(sample->bytes());
                                             benchmark::DoNotOptimize(read);
                                         }
                                         account(state, *sample);
                                     });
        benchmark::RegisterBenchmark(("BM_DecodeToDictionary<" + name + ">").c_str(),
                                     [&kind, sample](benchmark::State& state) {
                                         for (auto _ : state) {
                                             const std::size_t entries =
                                                 kind.oursDictionary(sample->bytes());
                                             benchmark::DoNotOptimize(entries);
                                         }
                                         account(state, *sample);
                                     });
    }
}

}  // namespace pyx::bench
