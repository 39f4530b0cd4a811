// The DIAG stream on arbitrary bytes: deframed, unwrapped and decoded with one decoder state
// throughout, without reading past a buffer. The stream fed whole and fed in pieces gives the
// same packets and the same counts, and a frame cut short at the end is counted, not an error.
//
// Input: the first byte sets the size of the pieces (1-256 bytes); the rest is the stream.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <map>
#include <span>

#include "sources/diag/stream/DiagStream.h"

namespace {

using pyx::diag::StreamStats;

[[noreturn]] void broken(const char* promise) {
    std::fprintf(stderr, "diag stream: %s\n", promise);
    std::abort();
}

struct Outcome {
    StreamStats stats;
    std::uint64_t packets = 0;
    std::uint64_t events = 0;
    std::uint64_t responses = 0;
};

Outcome feed(std::span<const std::uint8_t> stream, std::size_t piece) {
    pyx::diag::DiagStream::Options options;
    options.now = [] { return std::uint64_t{1600000000000ULL}; };
    pyx::diag::DiagStream diag(options);
    Outcome out;
    const auto onEvents = [&](pyx::diag::DecodedPacket& p) {
        if (p.events.empty()) broken("a packet handed on without events");
        ++out.packets;
        out.events += p.events.size();
    };
    const auto onResponse = [&](std::span<const std::uint8_t> r) {
        if (r.empty()) broken("an empty response");
        ++out.responses;
    };
    for (std::size_t at = 0; at < stream.size(); at += piece)
        diag.feed(stream.subspan(at, std::min(piece, stream.size() - at)), onEvents, onResponse);
    diag.finish();
    out.stats = diag.stats();
    return out;
}

template <typename Key>
bool sameCounts(const std::map<Key, StreamStats::Counts>& a,
                const std::map<Key, StreamStats::Counts>& b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end(), [](const auto& x, const auto& y) {
        return x.first == y.first && x.second.decoded == y.second.decoded &&
               x.second.notDecoded == y.second.notDecoded;
    });
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size < 1) return 0;
    const std::span<const std::uint8_t> stream(data + 1, size - 1);
    const Outcome whole = feed(stream, std::max<std::size_t>(stream.size(), 1));
    const Outcome pieces = feed(stream, std::size_t{data[0]} + 1);

    const StreamStats& s = whole.stats;
    if (s.frames.bytes != stream.size()) broken("bytes fed and counted differ");
    if (s.cutShort > stream.size()) broken("a cut frame longer than the stream");
    std::uint64_t others = 0, decoded = 0;
    for (const auto& [command, count] : s.otherCommands) others += count;
    for (const auto& [key, counts] : s.logs) decoded += counts.decoded;
    for (const auto& [key, counts] : s.events) decoded += counts.decoded;
    if (whole.responses > others) broken("more responses than other commands counted");
    if (whole.packets > decoded) broken("more packets handed on than decoded");

    const StreamStats& p = pieces.stats;
    if (p.frames.frames != s.frames.frames || p.frames.badFrames != s.frames.badFrames ||
        p.frames.empty != s.frames.empty || p.cutShort != s.cutShort ||
        p.malformed != s.malformed || p.otherCommands != s.otherCommands ||
        p.subscriptions != s.subscriptions || !sameCounts(p.logs, s.logs) ||
        !sameCounts(p.events, s.events) || p.firstTimeMs != s.firstTimeMs ||
        p.lastTimeMs != s.lastTimeMs || pieces.packets != whole.packets ||
        pieces.events != whole.events || pieces.responses != whole.responses)
        broken("the stream in pieces counts differently from the stream whole");
    return 0;
}
