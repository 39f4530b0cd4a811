// The benchmark program: loads the corpus, checks that our classes and the libprotobuf
// reference agree on it, registers the corpus benchmarks and runs everything.
//
// Usage: pyxon_bench [--corpus=FILE] [Google Benchmark options]
#include <benchmark/benchmark.h>

#include <cstring>
#include <iostream>
#include <string>

#include "bench/Corpus.h"
#include "bench/ReferenceCheck.h"
#include "bench/Registration.h"

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    std::string corpusPath = PYXON_BENCH_CORPUS;
    constexpr std::string_view kCorpusFlag = "--corpus=";
    for (int i = 1; i < argc; ++i) {
        const std::string_view arg(argv[i]);
        if (arg.starts_with(kCorpusFlag)) {
            corpusPath = std::string(arg.substr(kCorpusFlag.size()));
        } else {
            std::cerr << "pyxon_bench: unknown option " << arg << "\n";
            return 2;
        }
    }
    try {
        const auto corpus = pyx::bench::loadCorpus(corpusPath);
        if (!pyx::bench::checkReference(corpus, std::cerr)) return 1;
        pyx::bench::registerCompareBenchmarks(corpus);
        pyx::bench::registerIntakeBenchmarks(corpus);
#ifdef PYXON_BENCH_RECORDINGS
        pyx::bench::registerRecordingBenchmarks(corpus);
#endif
        benchmark::RunSpecifiedBenchmarks();
        benchmark::Shutdown();
    } catch (const pyx::bench::CorpusError& e) {
        std::cerr << "pyxon_bench: " << e.what() << "\n";
        return 1;
    }
    return 0;
}
