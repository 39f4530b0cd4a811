#include "tools/InfoCommand.h"

#include <cstdio>
#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>

#include "recordings/RecordingError.h"
#include "recordings/RecordingReader.h"
#include "tools/IsoTime.h"
#include "tools/MetricIDText.h"

namespace pyx {
namespace {

using Json = nlohmann::ordered_json;

Json timeOrNull(const std::optional<std::int64_t>& ns) {
    return ns ? Json(isoTime(*ns)) : Json(nullptr);
}

}  // namespace

int runInfo(const std::string& file, std::ostream& out, std::ostream& err) {
    recordings::RecordingReader::Summary summary;
    try {
        summary = recordings::RecordingReader(file).summary();
    } catch (const recordings::RecordingError& e) {
        err << "pyxonctl info: " << e.what() << '\n';
        return 1;
    }
    Json kinds = Json::object();
    for (const auto& [metricID, count] : summary.kinds) kinds[metricIDText(metricID)] = count;
    Json sessions = Json::array();
    for (const auto& session : summary.sessions) {
        sessions.push_back(Json{
            {"id", session.id},
            {"start", isoTime(session.startNs)},
            {"program_version", session.programVersion},
            {"source", session.source},
            {"seed", session.seed ? Json(*session.seed) : Json(nullptr)},
            {"speed", session.speed ? Json(*session.speed) : Json(nullptr)},
            {"host", session.host},
        });
    }
    Json positions(nullptr);
    if (const auto& p = summary.positions) {
        positions = Json{
            {"fixes", p->count},
            {"first", isoTime(p->firstNs)},
            {"last", isoTime(p->lastNs)},
            {"box",
             Json{{"south", p->south}, {"west", p->west}, {"north", p->north}, {"east", p->east}}},
        };
    }
    const double duration = summary.firstNs && summary.lastNs
                                ? static_cast<double>(*summary.lastNs - *summary.firstNs) / 1e9
                                : 0.0;
    const Json info{
        {"file", file},
        {"events", summary.events},
        {"first", timeOrNull(summary.firstNs)},
        {"last", timeOrNull(summary.lastNs)},
        {"duration_s", duration},
        {"kinds", std::move(kinds)},
        {"format_version", summary.formatVersion},
        {"sessions", std::move(sessions)},
        {"positions", std::move(positions)},
    };
    out << info.dump(-1, ' ', false, Json::error_handler_t::replace) << '\n';
    out.flush();
    return 0;
}

Subcommand addInfoCommand(CLI::App& pyxonctl) {
    CLI::App* info =
        pyxonctl.add_subcommand("info", "Say what a recording (.pyxrec) holds, as one JSON object");
    auto file = std::make_shared<std::string>();
    info->add_option("FILE", *file, "The recording, made with --record")->required();
    info->footer(
        "Example:\n"
        "  pyxonctl info drive.pyxrec\n"
        "prints\n"
        "  {\"file\":\"drive.pyxrec\",\"events\":1234,\"first\":\"2026-11-23T19:05:50.123456789Z\","
        "\"last\":\"2026-11-23T19:06:51.623456789Z\",\"duration_s\":61.5,\"kinds\":{\"0x3C4E04\""
        ":12,...},\"format_version\":2,\"sessions\":[{\"id\":1,\"start\":\"...\","
        "\"program_version\":\"0.1.0\",\"source\":\"sim\",\"seed\":1,\"speed\":20.0,\"host\":"
        "\"car-laptop\"}],\"positions\":{\"fixes\":61,\"first\":\"...\",\"last\":\"...\","
        "\"box\":{\"south\":48.8566,\"west\":2.3522,\"north\":48.8605,\"east\":2.3611}}}\n"
        "positions: the GPS fixes of runs with --gps (their own times, the box they lie in, in "
        "degrees), null without.\nTimes are UTC. A file that is missing, not a recording, of a "
        "newer format or damaged "
        "gives one\nline on stderr and exit code 1.\n");
    return Subcommand{info, [file] { return runInfo(*file, std::cout, std::cerr); }};
}

}  // namespace pyx
