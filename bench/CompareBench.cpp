// Typed decode and bytes to dictionary, our classes against libprotobuf, on the same bytes.
#include <benchmark/benchmark.h>

#include <cstdint>
#include <string>

#include "bench/BenchKinds.h"
#include "bench/Registration.h"

namespace pyx::bench {

std::vector<Subject> subjectsOf(const std::vector<CorpusRecord>& corpus) {
    std::vector<Subject> subjects;
    for (const BenchKind& kind : benchKinds()) {
        Subject s{std::string(kind.messageClass), {}};
        for (const CorpusRecord& r : corpus) {
            if (!r.large && r.metricID == kind.metricID) s.records.push_back(&r);
        }
        if (!s.records.empty()) subjects.push_back(std::move(s));
    }
    for (const CorpusRecord& r : corpus) {
        if (r.large) subjects.push_back(Subject{r.label, {&r}});
    }
    // The simulated stream alone, as the app sees it, then everything.
    Subject realistic{"realistic", {}};
    for (const CorpusRecord& r : corpus) {
        if (!r.large) realistic.records.push_back(&r);
    }
    subjects.push_back(std::move(realistic));
    Subject all{"corpus", {}};
    for (const CorpusRecord& r : corpus) all.records.push_back(&r);
    subjects.push_back(std::move(all));
    return subjects;
}

namespace {

// One record as the loops see it: its bytes and its kind's functions.
struct Item {
    Payload payload;
    const BenchKind* kind;
};

struct Items {
    std::vector<Item> items;
    std::int64_t bytes = 0;
};

Items itemsOf(const Subject& subject) {
    Items out;
    for (const CorpusRecord* r : subject.records) {
        out.items.push_back(Item{r->bytes(), benchKindFor(r->metricID)});
        out.bytes += static_cast<std::int64_t>(r->payload.size());
    }
    return out;
}

void account(benchmark::State& state, const Items& items) {
    state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(items.items.size()));
    state.SetBytesProcessed(state.iterations() * items.bytes);
    state.counters["bytes_per_msg"] =
        static_cast<double>(items.bytes) / static_cast<double>(items.items.size());
}

using Decode = bool (*)(Payload);
using Render = std::size_t (*)(Payload);

void registerDecode(const std::string& name, const Items& items, Decode BenchKind::*decode) {
    benchmark::RegisterBenchmark(name.c_str(), [items, decode](benchmark::State& state) {
        for (const Item& item : items.items) {
            if (!(item.kind->*decode)(item.payload)) {
                state.SkipWithError("a record did not decode");
                return;
            }
        }
        for (auto _ : state) {
            for (const Item& item : items.items) {
                benchmark::DoNotOptimize((item.kind->*decode)(item.payload));
            }
        }
        account(state, items);
    });
}

void registerRender(const std::string& name, const Items& items, Render BenchKind::*render) {
    benchmark::RegisterBenchmark(name.c_str(), [items, render](benchmark::State& state) {
        for (const Item& item : items.items) {
            if ((item.kind->*render)(item.payload) == 0) {
                state.SkipWithError("a record gave no dictionary");
                return;
            }
        }
        for (auto _ : state) {
            for (const Item& item : items.items) {
                benchmark::DoNotOptimize((item.kind->*render)(item.payload));
            }
        }
        account(state, items);
    });
}

}  // namespace

void registerCompareBenchmarks(const std::vector<CorpusRecord>& corpus) {
    for (const Subject& subject : subjectsOf(corpus)) {
        const Items items = itemsOf(subject);
        registerDecode("typed/ours/" + subject.name, items, &BenchKind::oursDecode);
        registerDecode("typed/pb_fresh/" + subject.name, items, &BenchKind::referenceDecodeFresh);
        registerDecode("typed/pb_reused/" + subject.name, items, &BenchKind::referenceDecodeReused);
        registerRender("dict/ours/" + subject.name, items, &BenchKind::oursDictionary);
        registerRender("dict/pb_json/" + subject.name, items, &BenchKind::referenceJson);
    }
}

}  // namespace pyx::bench
