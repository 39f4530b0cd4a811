#include "tools/MapExport.h"

#include <array>
#include <cstdio>
#include <functional>
#include <nlohmann/json.hpp>
#include <optional>

#include "baseband/EventRecord.h"
#include "core/Format.h"
#include "metrics/MetricValidator.h"
#include "metrics/history/ServingLevel.h"
#include "recordings/RecordingError.h"
#include "tools/DecodeCommand.h"
#include "tools/FlatFields.h"
#include "tools/IsoTime.h"
#include "tools/MetricIDText.h"
#include "tools/PositionJoin.h"

namespace pyx {
namespace {

using Json = nlohmann::ordered_json;
using recordings::RecordedEvent;
using recordings::RecordingError;
using recordings::RecordingReader;

// One event the store decoded, with the fix it was measured at and the serving level then.
struct PlacedEvent {
    const RecordedEvent& event;
    const DecodeOutcome& outcome;
    const gps::Fix& fix;
    const std::optional<ServingLevel> level;
};

struct Placed {
    int status = 0;  // 1: the recording is damaged
    std::uint64_t events = 0;
    std::uint64_t placed = 0;
};

// Every event of filter the store decodes and a fix places, in order, to visit. Says on err
// the events refused, those without a position, and a damaged recording.
Placed forEachPlaced(const RecordingReader& reader, const RecordingReader::Filter& filter,
                     const PositionJoin& positions, std::ostream& err,
                     const std::function<void(const PlacedEvent&)>& visit) {
    const auto store = MetricValidator::create(nullptr);
    ServingLevelTracker level;
    Placed placed;
    std::uint64_t refused = 0;
    try {
        reader.forEach(filter, [&](RecordedEvent& event) {
            ++placed.events;
            const DecodeOutcome outcome =
                decodeRecord(*store, metricRecordFromEvent(std::move(event.object)));
            if (outcome.error) {
                ++refused;
                err << "pyxonctl export: event " << event.id
                    << " skipped: " << metricIDText(outcome.metricID) << ": " << *outcome.error
                    << '\n';
                return true;
            }
            if (outcome.dictionary == nullptr) return true;
            level.update(outcome.property, *outcome.dictionary, event.wallNs);
            const gps::Fix* fix = positions.at(event.wallNs);
            if (fix == nullptr) return true;
            ++placed.placed;
            visit(PlacedEvent{event, outcome, *fix, level.current(event.wallNs)});
            return true;
        });
    } catch (const RecordingError& e) {
        err << "pyxonctl export: " << e.what() << "; exported the " << placed.events
            << " events read before it\n";
        placed.status = 1;
    }
    if (refused > 0)
        err << "pyxonctl export: " << refused << " of " << placed.events
            << " records were refused by the store and skipped\n";
    if (positions.empty())
        err << "pyxonctl export: the recording holds no positions (record with --gps); "
               "nothing to place\n";
    else if (placed.placed < placed.events)
        err << "pyxonctl export: " << placed.events - placed.placed << " of " << placed.events
            << " events had no fix within 2 s and are not placed\n";
    return placed;
}

Json jsonOf(const Value& value) {
    switch (value.kind()) {
        case Value::Kind::Int:
            return value.asInt();
        case Value::Kind::UInt:
            return value.asUInt();
        case Value::Kind::Float:
            return static_cast<double>(value.asFloat());
        case Value::Kind::Bool:
            return value.asBool();
        default:
            return cellText(value);
    }
}

std::string degrees(double value) {
    return format("%.7f", value);
}

// KML's colours are aabbggrr: green, yellow-green, yellow, orange, red; grey for no level.
constexpr std::array<std::string_view, 5> kKmlColours = {"ff00c800", "ff32cd9a", "ff00e6ff",
                                                         "ff008cff", "ff0000e6"};
constexpr std::string_view kKmlNoLevel = "ff909090";

void appendXmlText(std::string& out, std::string_view text) {
    for (const char c : text) {
        switch (c) {
            case '&':
                out += "&amp;";
                break;
            case '<':
                out += "&lt;";
                break;
            case '>':
                out += "&gt;";
                break;
            case '"':
                out += "&quot;";
                break;
            default:
                out += c;
        }
    }
}

std::string coordinates(const gps::Fix& fix) {
    std::string text = degrees(fix.lon) + "," + degrees(fix.lat);
    if (fix.altM) text += "," + format("%.1f", *fix.altM);
    return text;
}

}  // namespace

int exportGeoJson(const RecordingReader& reader, const RecordingReader::Filter& filter,
                  const std::string& title, std::ostream& out, std::ostream& err) {
    PositionJoin positions(reader);
    out << R"({"type": "FeatureCollection", "name": )" << Json(title).dump()
        << R"(, "features": [)";
    bool first = true;
    std::string path;
    const Placed placed = forEachPlaced(reader, filter, positions, err, [&](const PlacedEvent& p) {
        Json properties{{"time", isoTime(p.event.wallNs)},
                        {"metric", metricIDText(p.outcome.metricID)},
                        {"property", p.outcome.property}};
        if (p.level) {
            properties["serving_technology"] = p.level->technology;
            properties["serving_quantity"] = p.level->quantity;
            properties["serving_dBm"] = p.level->dBm;
            properties["serving_class"] =
                kLevelClassNames[static_cast<std::size_t>(p.level->levelClass)];
        }
        path.clear();
        flatten(*p.outcome.dictionary, path,
                [&](const std::string& name, const Value& v) { properties[name] = jsonOf(v); });
        Json coordinates = Json::array({p.fix.lon, p.fix.lat});
        if (p.fix.altM) coordinates.push_back(*p.fix.altM);
        const Json feature{
            {"type", "Feature"},
            {"geometry", Json{{"type", "Point"}, {"coordinates", std::move(coordinates)}}},
            {"properties", std::move(properties)}};
        out << (first ? "\n" : ",\n")
            << feature.dump(-1, ' ', false, Json::error_handler_t::replace);
        first = false;
    });
    out << "\n]}\n";
    out.flush();
    return placed.status;
}

int exportKml(const RecordingReader& reader, const RecordingReader::Filter& filter,
              const std::string& title, std::ostream& out, std::ostream& err) {
    PositionJoin positions(reader);
    std::string text;
    text +=
        "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
        "<kml xmlns=\"http://www.opengis.net/kml/2.2\">\n<Document>\n<name>";
    appendXmlText(text, title);
    text += "</name>\n";
    const auto style = [&text](std::string_view id, std::string_view colour) {
        text += "<Style id=\"";
        text += id;
        text += "\"><IconStyle><color>";
        text += colour;
        text +=
            "</color><scale>0.6</scale><Icon><href>"
            "http://maps.google.com/mapfiles/kml/shapes/shaded_dot.png</href></Icon>"
            "</IconStyle></Style>\n";
    };
    for (std::size_t i = 0; i < kKmlColours.size(); ++i)
        style("level" + std::to_string(i), kKmlColours[i]);
    style("nolevel", kKmlNoLevel);
    text +=
        "<Style id=\"track\"><LineStyle><color>ffb06000</color><width>2</width></LineStyle>"
        "</Style>\n";
    out << text;
    std::string path;
    const Placed placed = forEachPlaced(reader, filter, positions, err, [&](const PlacedEvent& p) {
        text.clear();
        text += "<Placemark><name>";
        text += metricIDText(p.outcome.metricID);
        text += "</name><TimeStamp><when>";
        appendIsoTime(text, p.event.wallNs);
        text += "</when></TimeStamp><styleUrl>#";
        text += p.level ? "level" + std::to_string(p.level->levelClass) : std::string("nolevel");
        text += "</styleUrl><description>";
        std::string description;
        if (p.level)
            description +=
                format("%.*s %.*s %s dBm (%.*s)\n", static_cast<int>(p.level->technology.size()),
                       p.level->technology.data(), static_cast<int>(p.level->quantity.size()),
                       p.level->quantity.data(), formatFloat(p.level->dBm).c_str(),
                       static_cast<int>(kLevelClassNames[p.level->levelClass].size()),
                       kLevelClassNames[p.level->levelClass].data());
        description += p.outcome.property + "\n";
        path.clear();
        flatten(*p.outcome.dictionary, path, [&](const std::string& name, const Value& v) {
            description += name + " = " + cellText(v) + "\n";
        });
        appendXmlText(text, description);
        text += "</description><Point><coordinates>";
        text += coordinates(p.fix);
        text += "</coordinates></Point></Placemark>\n";
        out << text;
    });
    // The track: every fix that arrived within the time asked for.
    text.clear();
    std::size_t points = 0;
    std::string line;
    for (const gps::Fix& fix : positions.fixes()) {
        if (filter.fromNs && fix.receivedNs < *filter.fromNs) continue;
        if (filter.toNs && fix.receivedNs > *filter.toNs) continue;
        line += coordinates(fix);
        line += ' ';
        ++points;
    }
    if (points >= 2) {
        text +=
            "<Placemark><name>Track</name><styleUrl>#track</styleUrl><LineString>"
            "<tessellate>1</tessellate><coordinates>";
        text += line;
        text += "</coordinates></LineString></Placemark>\n";
    }
    text += "</Document>\n</kml>\n";
    out << text;
    out.flush();
    return placed.status;
}

}  // namespace pyx
