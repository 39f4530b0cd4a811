#include "tools/ExportCommand.h"

#include <CLI/CLI.hpp>

#include <array>
#include <charconv>
#include <iostream>
#include <memory>
#include <unordered_map>
#include <utility>

#include "baseband/EventRecord.h"
#include "baseband/velk/Names.h"
#include "core/Format.h"
#include "core/Log.h"
#include "metrics/MetricValidator.h"
#include "recordings/RecordingError.h"
#include "recordings/RecordingReader.h"
#include "tools/CsvText.h"
#include "tools/DecodeCommand.h"
#include "tools/FlatFields.h"
#include "tools/IsoTime.h"
#include "tools/MapExport.h"
#include "tools/MetricIDText.h"
#include "tools/PositionJoin.h"
#include "tools/RecordWriter.h"

namespace pyx {
namespace {

using recordings::RecordedEvent;
using recordings::RecordingError;
using recordings::RecordingReader;

constexpr std::size_t kChunk = 1 << 16;

std::optional<std::int64_t> metricIDFromHex(std::string_view text) {
    if (text.starts_with("0x") || text.starts_with("0X")) text.remove_prefix(2);
    std::int64_t value = 0;
    const auto* end = text.data() + text.size();
    const auto [at, error] = std::from_chars(text.data(), end, value, 16);
    if (text.empty() || error != std::errc{} || at != end) return std::nullopt;
    return value;
}

// The store's standard-output lines are not wanted while exporting.
class QuietStore {
  public:
    QuietStore() {
        standardOutputSink().intercept([](std::string_view) {});
    }
    ~QuietStore() { standardOutputSink().intercept({}); }
    QuietStore(const QuietStore&) = delete;
    QuietStore& operator=(const QuietStore&) = delete;
};

// The event's record; its object is taken, not copied.
MetricRecord recordOf(RecordedEvent& event) {
    return metricRecordFromEvent(std::move(event.object));
}

void damagedLine(std::ostream& err, const RecordingError& e, std::uint64_t exported) {
    err << "pyxonctl export: " << e.what() << "; exported the " << exported
        << " events read before it\n";
}

struct Written {
    int status = 0;            // 1 when the recording was damaged, else 0
    std::uint64_t events = 0;  // read from the recording
};

// Every event of the filter, as append writes it after what buffer already holds, to out in
// chunks. A damaged recording ends it with one line on err. Whether out took everything is the
// caller's to see.
template <typename Append>
Written writeEvents(const RecordingReader& reader, const RecordingReader::Filter& filter,
                    std::string buffer, std::ostream& out, std::ostream& err,
                    const Append& append) {
    buffer.reserve(kChunk + 4096);
    std::uint64_t exported = 0;
    int status = 0;
    try {
        reader.forEach(filter, [&](RecordedEvent& event) {
            ++exported;
            append(buffer, event);
            if (buffer.size() >= kChunk) {
                out.write(buffer.data(), static_cast<std::streamsize>(buffer.size()));
                buffer.clear();
            }
            return out.good();
        });
    } catch (const RecordingError& e) {
        damagedLine(err, e, exported);
        status = 1;
    }
    out.write(buffer.data(), static_cast<std::streamsize>(buffer.size()));
    out.flush();
    return Written{status, exported};
}

// The position columns of csv, and the keys of jsonl's "gps" object, in this order.
constexpr std::array<std::string_view, 7> kPositionColumns = {"gps_lat",
                                                              "gps_lon",
                                                              "gps_alt_m",
                                                              "gps_speed_mps",
                                                              "gps_track_deg",
                                                              "gps_fix",
                                                              "gps_horizontal_error_m"};

std::array<std::string, 7> positionCells(const gps::Fix* fix) {
    if (fix == nullptr) return {};
    const auto optional = [](const std::optional<double>& v) {
        return v ? format("%.3f", *v) : std::string();
    };
    return {format("%.7f", fix->lat),
            format("%.7f", fix->lon),
            optional(fix->altM),
            optional(fix->speedMps),
            optional(fix->trackDeg),
            fix->mode == gps::FixMode::ThreeD ? "3D" : "2D",
            optional(fix->horizontalErrorM)};
}

void appendPosition(std::string& out, const gps::Fix* fix) {
    out.pop_back();  // the closing brace
    if (fix == nullptr) {
        out += R"(, "gps": null})";
        return;
    }
    const auto cells = positionCells(fix);
    out += R"(, "gps": {)";
    bool first = true;
    for (std::size_t i = 0; i < cells.size(); ++i) {
        if (cells[i].empty()) continue;
        out += first ? "\"" : ", \"";
        out += kPositionColumns[i].substr(4);
        out += "\": ";
        const bool text = kPositionColumns[i] == "gps_fix";
        if (text) out += '"';
        out += cells[i];
        if (text) out += '"';
        first = false;
    }
    out += "}}";
}

int exportJsonl(const RecordingReader& reader, const RecordingReader::Filter& filter,
                std::ostream& out, std::ostream& err) {
    const PositionJoin positions(reader);
    return writeEvents(reader, filter, {}, out, err,
                       [&positions](std::string& buffer, RecordedEvent& event) {
                           appendExportLine(buffer, event);
                           if (!positions.empty())
                               appendPosition(buffer, positions.at(event.wallNs));
                           buffer += '\n';
                       })
        .status;
}

int exportCsv(const RecordingReader& reader, const RecordingReader::Filter& filter,
              std::ostream& out, std::ostream& err) {
    const QuietStore quiet;
    const PositionJoin positions(reader);
    // First pass: the columns, in the order first seen.
    std::vector<std::string> columns{"time", "metric", "property"};
    std::unordered_map<std::string, std::size_t> columnIndex;
    for (std::size_t i = 0; i < columns.size(); ++i) columnIndex.emplace(columns[i], i);
    std::string path;
    {
        const auto store = MetricValidator::create(nullptr);
        try {
            reader.forEach(filter, [&](RecordedEvent& event) {
                const DecodeOutcome outcome = decodeRecord(*store, recordOf(event));
                if (outcome.dictionary == nullptr) return true;
                path.clear();
                flatten(*outcome.dictionary, path, [&](const std::string& name, const Value&) {
                    if (columnIndex.emplace(name, columns.size()).second) columns.push_back(name);
                });
                return true;
            });
        } catch (const RecordingError&) {
            // The second pass stops at the same place and says so.
        }
    }

    // The position columns come last, when the recording has positions.
    const std::size_t positionAt = columns.size();
    if (!positions.empty())
        for (const std::string_view name : kPositionColumns) columns.emplace_back(name);

    // Second pass: the rows.
    std::string header;
    appendCsvRow(header, columns);
    std::vector<std::string> cells(columns.size());
    std::uint64_t refused = 0;
    const auto store = MetricValidator::create(nullptr);
    const Written written = writeEvents(
        reader, filter, std::move(header), out, err,
        [&](std::string& buffer, RecordedEvent& event) {
            const DecodeOutcome outcome = decodeRecord(*store, recordOf(event));
            if (outcome.error) {
                ++refused;
                err << "pyxonctl export: event " << event.id
                    << " skipped: " << metricIDText(outcome.metricID) << ": " << *outcome.error
                    << '\n';
                return;
            }
            if (outcome.dictionary == nullptr) return;
            for (auto& cell : cells) cell.clear();
            cells[0] = isoTime(event.wallNs);
            cells[1] = metricIDText(outcome.metricID);
            cells[2] = outcome.property;
            path.clear();
            flatten(*outcome.dictionary, path, [&](const std::string& name, const Value& v) {
                const auto at = columnIndex.find(name);
                if (at != columnIndex.end()) cells[at->second] = cellText(v);
            });
            if (!positions.empty()) {
                auto place = positionCells(positions.at(event.wallNs));
                for (std::size_t i = 0; i < place.size(); ++i)
                    cells[positionAt + i] = std::move(place[i]);
            }
            appendCsvRow(buffer, cells);
        });
    if (refused > 0)
        err << "pyxonctl export: " << refused << " of " << written.events
            << " records were refused by the store and skipped\n";
    return written.status;
}

}  // namespace

void appendExportLine(std::string& out, const RecordedEvent& event) {
    out += R"({"time": ")";
    appendIsoTime(out, event.wallNs);
    out += '"';
    // Then the record as pyxonctl listen prints it.
    if (event.object.isDict() && !event.object.asDict().empty()) {
        out += ", ";
        appendRecordFields(out, event.object.asDict());
    }
    out += '}';
}

int runExport(const ExportRequest& request, std::ostream& out, std::ostream& err) {
    RecordingReader::Filter filter;
    filter.stream = velk::kEventMetric;
    for (const auto& kind : request.kinds) {
        const auto metricID = metricIDFromHex(kind);
        if (!metricID) {
            err << "pyxonctl export: --kind '" << kind
                << "' is not a metric ID in hex; example: --kind 0x3C4E04\n";
            return 2;
        }
        filter.metricIDs.push_back(*metricID);
    }
    const auto time = [&](const std::optional<std::string>& text, const char* option,
                          std::optional<std::int64_t>& into) {
        if (!text) return true;
        IsoTimeRefusal refusal = IsoTimeRefusal::NotATime;
        into = parseIsoTime(*text, &refusal);
        if (into) return true;
        err << "pyxonctl export: " << option << " '" << *text;
        if (refusal == IsoTimeRefusal::OutOfRange)
            err << "' is outside the times a recording can hold, " << isoTimeRange() << '\n';
        else
            err << "' is not a time; example: 2026-11-23T19:05:50Z (UTC without a zone)\n";
        return false;
    };
    if (!time(request.from, "--from", filter.fromNs) || !time(request.to, "--to", filter.toNs))
        return 2;
    if (request.format != "jsonl" && request.format != "csv" && request.format != "geojson" &&
        request.format != "kml") {
        err << "pyxonctl export: --format '" << request.format
            << "': expected jsonl, csv, geojson or kml\n";
        return 2;
    }
    std::optional<RecordingReader> reader;
    try {
        reader.emplace(request.file);
    } catch (const RecordingError& e) {
        err << "pyxonctl export: " << e.what() << '\n';
        return 1;
    }
    int status = 0;
    try {
        if (request.format == "csv")
            status = exportCsv(*reader, filter, out, err);
        else if (request.format == "geojson")
            status = exportGeoJson(*reader, filter, request.file, out, err);
        else if (request.format == "kml")
            status = exportKml(*reader, filter, request.file, out, err);
        else
            status = exportJsonl(*reader, filter, out, err);
    } catch (const RecordingError& e) {
        // The positions could not be read.
        err << "pyxonctl export: " << e.what() << '\n';
        return 1;
    }
    // A full disk or a closed pipe: what was asked for did not all get out.
    if (!out) {
        err << "pyxonctl export: writing the output failed\n";
        return 1;
    }
    return status;
}

Subcommand addExportCommand(CLI::App& pyxonctl) {
    CLI::App* command = pyxonctl.add_subcommand(
        "export",
        "Write the metric events of a recording (.pyxrec) as JSON Lines, CSV, GeoJSON or KML");
    auto request = std::make_shared<ExportRequest>();
    command->add_option("FILE", request->file, "The recording, made with --record")->required();
    command->add_option("--format", request->format, "jsonl, csv, geojson or kml")
        ->check(CLI::IsMember({"jsonl", "csv", "geojson", "kml"}))
        ->capture_default_str();
    command
        ->add_option("--kind", request->kinds,
                     "Only this metric ID, in hex (may be given more than once)")
        ->type_name("HEX");
    command->add_option("--from", request->from, "Only events that arrived at or after TIME")
        ->type_name("TIME");
    command->add_option("--to", request->to, "Only events that arrived at or before TIME")
        ->type_name("TIME");
    command->footer(
        "jsonl: one line per metric event, in order, as pyxonctl listen prints it with the time\n"
        "of arrival first:\n"
        "  {\"time\": \"2026-11-23T19:05:50.123456789Z\", \"kKeyMetricID\": 3952132, "
        "\"kKeyPayload\": \"0a08...\"}\n"
        "csv: one row per event the store decodes: time, metric, property and one column per\n"
        "field of the decoded dictionary (inst_values.0.rsrp0 ...); the header holds every "
        "column\nof the kinds asked for. Records the store refuses are skipped, one stderr line "
        "each.\n"
        "Positions (a recording made with --gps): jsonl lines end with \"gps\": {lat, lon, "
        "alt_m,\nspeed_mps, track_deg, fix, horizontal_error_m} and csv rows with the columns "
        "gps_lat ...\ngps_horizontal_error_m: the latest fix no older than 2 s when the event "
        "arrived, else\nnull or empty. Without positions both are as before.\n"
        "geojson: a FeatureCollection (RFC 7946, WGS 84) of one Point [lon, lat] per event with "
        "a\nposition; properties: time, metric, property, the serving level then (serving_dBm, "
        "...)\nand the event's fields as csv names them. kml: KML 2.2, a Placemark per such "
        "event\ncoloured by the serving level (LTE RSRP, UMTS RSSI, GSM RxLev) and the track as "
        "a line.\nBoth open in QGIS and Google Earth.\n"
        "TIME is ISO 8601, UTC unless it names a zone: 2026-11-23T19:05:50Z, 2026-11-23 "
        "19:05,\n2026-11-23T21:05:50.5+02:00. A damaged recording exports what can be read and "
        "says\nhow much that was (exit code 1).\n"
        "Examples:\n"
        "  pyxonctl export drive.pyxrec --format jsonl | pyxonctl screen LTE \"CA Status\"\n"
        "  pyxonctl export drive.pyxrec --format csv --kind 0x3C4E04 > rrc-state.csv\n"
        "  pyxonctl export drive.pyxrec --format csv --from 2026-11-23T19:05Z --to "
        "2026-11-23T19:10Z\n"
        "  pyxonctl export drive.pyxrec --format geojson --kind 0x3C4F6A > rsrp.geojson\n"
        "  pyxonctl export drive.pyxrec --format kml > drive.kml\n");
    return Subcommand{command, [request] { return runExport(*request, std::cout, std::cerr); }};
}

}  // namespace pyx
