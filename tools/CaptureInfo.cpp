#include "tools/CaptureInfo.h"

#include <fstream>
#include <nlohmann/json.hpp>
#include <ostream>
#include <string_view>
#include <vector>

#include "core/Format.h"
#include "sources/diag/LogDecoder.h"
#include "sources/diag/stream/DiagStream.h"
#include "tools/IsoTime.h"

namespace pyx {
namespace {

using Json = nlohmann::ordered_json;

// The name of the decoder rows that take code, or null when none does.
Json rowName(std::uint16_t code) {
    for (const auto table : diag::logDecoderTables())
        for (const diag::LogDecoderRow& row : table)
            if (row.code == code) return std::string(row.name);
    return nullptr;
}

Json timeOrNull(const std::optional<std::uint64_t>& ms) {
    return ms ? Json(isoTime(static_cast<std::int64_t>(*ms) * 1'000'000)) : Json(nullptr);
}

}  // namespace

std::optional<int> runCaptureInfo(const std::string& file, std::ostream& out) {
    std::ifstream in(file, std::ios::binary);
    if (!in) return std::nullopt;
    // An SQLite database (a recording of another program) is not read as a byte stream.
    constexpr std::string_view kSqliteMagic{"SQLite format 3\0", 16};
    std::string head(kSqliteMagic.size(), '\0');
    in.read(head.data(), static_cast<std::streamsize>(head.size()));
    if (head == kSqliteMagic) return std::nullopt;
    in.clear();
    in.seekg(0);
    diag::DiagStream stream;
    const diag::DiagStream::EventSink ignore = [](diag::DecodedPacket&) {};
    std::vector<std::uint8_t> chunk(1 << 20);
    while (in) {
        in.read(reinterpret_cast<char*>(chunk.data()), static_cast<std::streamsize>(chunk.size()));
        const auto got = static_cast<std::size_t>(in.gcount());
        if (got == 0) break;
        stream.feed(std::span(chunk.data(), got), ignore);
    }
    stream.finish();
    const diag::StreamStats& stats = stream.stats();
    if (stats.frames.frames == 0) return std::nullopt;

    Json logs = Json::array();
    for (const auto& [key, counts] : stats.logs)
        logs.push_back({{"code", format("0x%04X", key.first)},
                        {"version", key.second},
                        {"name", rowName(key.first)},
                        {"decoded", counts.decoded},
                        {"not_decoded", counts.notDecoded}});
    Json events = Json::array();
    for (const auto& [id, counts] : stats.events)
        events.push_back(
            {{"id", id}, {"decoded", counts.decoded}, {"not_decoded", counts.notDecoded}});
    Json other = Json::object();
    for (const auto& [command, count] : stats.otherCommands)
        other[format("0x%02X", command)] = count;
    Json subscriptions = Json::object();
    for (const auto& [id, count] : stats.subscriptions) subscriptions[std::to_string(id)] = count;
    const Json object = {{"file", file},
                         {"kind", "diag capture"},
                         {"bytes", stats.frames.bytes},
                         {"frames", stats.frames.frames},
                         {"bad_frames", stats.frames.badFrames},
                         {"cut_short_bytes", stats.cutShort},
                         {"malformed", stats.malformed},
                         {"first", timeOrNull(stats.firstTimeMs)},
                         {"last", timeOrNull(stats.lastTimeMs)},
                         {"logs", std::move(logs)},
                         {"events", std::move(events)},
                         {"other_commands", std::move(other)},
                         {"subscriptions", std::move(subscriptions)}};
    out << object.dump() << '\n';
    return 0;
}

}  // namespace pyx
