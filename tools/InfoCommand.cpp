#include "tools/InfoCommand.h"

#include <cstdio>
#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>

#include "recordings/RecordingError.h"
#include "recordings/RecordingReader.h"
#include "tools/CaptureInfo.h"
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
        // A file that is no SQLite database may be a raw DIAG capture.
        const bool notARecording = e.kind() == recordings::RecordingError::Kind::NotARecording;
        if (notARecording)
            if (const auto status = runCaptureInfo(file, out)) return *status;
        err << "pyxonctl info: " << e.what()
            << (notARecording ? " nor a DIAG capture (no DIAG frame in it)" : "") << '\n';
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
    CLI::App* info = pyxonctl.add_subcommand("info",
                                             "Say what a recording (.pyxrec) or a raw DIAG capture "
                                             "(.qmdl, .mi2log) holds, as one JSON object");
    auto file = std::make_shared<std::string>();
    info->add_option("FILE", *file,
                     "The recording, made with --record, or a DIAG capture (--qmdl, or another "
                     "tool's raw port stream)")
        ->required();
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
        "degrees), null without.\n"
        "A DIAG capture gives, per log code and version, the packets decoded and not decoded,\n"
        "the bad frames, the multi-SIM subscriptions and the modem's first and last time:\n"
        "  pyxonctl info drive.qmdl\n"
        "  {\"file\":\"drive.qmdl\",\"kind\":\"diag capture\",\"bytes\":524026,\"frames\":1808,"
        "\"bad_frames\":0,...,\"logs\":[{\"code\":\"0xB193\",\"version\":1,\"name\":\"...\","
        "\"decoded\":1091,\"not_decoded\":0},...],\"subscriptions\":{}}\n"
        "Times are UTC. A file that is missing, neither a recording nor a capture, of a newer\n"
        "format or damaged gives one line on stderr and exit code 1.\n");
    return Subcommand{info, [file] { return runInfo(*file, std::cout, std::cerr); }};
}

}  // namespace pyx
