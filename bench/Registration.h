// The benchmarks that run over the corpus are registered at start-up, once the corpus is
// loaded: one per metric kind, one per large record, and the whole corpus.
//
// Names are "<measure>/<side>/<subject>": measure typed, dict, intake, history, path or screen;
// side ours, pb_fresh, pb_reused or pb_json; subject a message class, "large: ..." or "corpus".
// bench/run turns them into its table.
#pragma once

#include <vector>

#include "bench/Corpus.h"

namespace pyx::bench {

// The records measured together under one subject.
struct Subject {
    std::string name;
    std::vector<const CorpusRecord*> records;
};

// Per kind (the realistic records of each class), per large record, all realistic records
// ("realistic") and the whole corpus ("corpus", last).
[[nodiscard]] std::vector<Subject> subjectsOf(const std::vector<CorpusRecord>& corpus);

// Typed decode and bytes to dictionary, ours against libprotobuf.
void registerCompareBenchmarks(const std::vector<CorpusRecord>& corpus);
// The intake, the whole event path, and the largest category screen.
void registerIntakeBenchmarks(const std::vector<CorpusRecord>& corpus);
// Recordings: writing, exporting as JSON Lines, replaying (named "recording/...").
void registerRecordingBenchmarks(const std::vector<CorpusRecord>& corpus);

}  // namespace pyx::bench
