// pyxonctl info and export over recordings, in process and as a program.
#include <gtest/gtest.h>
#include <sys/wait.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <limits>
#include <nlohmann/json.hpp>
#include <set>
#include <sstream>
#include <thread>

#include "baseband/EventRecord.h"
#include "core/Log.h"
#include "recordings/RecordingWriter.h"
#include "sources/sim/SimulatedBaseband.h"
#include "tests/recordings/SampleEvents.h"
#include "tests/recordings/TempDir.h"
#include "tests/support/ProgramRun.h"
#include "tests/tools/InProcess.h"
#include "tools/CsvText.h"
#include "tools/ExportCommand.h"
#include "tools/InfoCommand.h"
#include "tools/IsoTime.h"
#include "tools/MetricIDText.h"
#include "tools/RecordWriter.h"
#ifdef PYXON_HAVE_SCREEN_COMMAND
#include "tools/ScreenCommand.h"
#endif

namespace {

using Json = nlohmann::ordered_json;
using pyx::Bytes;
using pyx::Dict;
using pyx::Value;
using pyx::recordings::RecordingWriter;
using pyx::testing::readAll;
using pyx::testing::sampleEvent;
using pyx::testing::TempDir;

constexpr std::int64_t kRsrpKind = 0x3C4F6A;  // LTE RSRP/RSRQ/SINR, the serving cell's
constexpr std::int64_t kRrcStateKind = 0x3C4E04;

RecordingWriter::Options writerOptions(const std::string& file, bool append = false) {
    RecordingWriter::Options options;
    options.path = file;
    options.append = append;
    options.session.programVersion = "0.1.0";
    options.session.source = append ? "modem:0" : "sim";
    if (!append) options.session.seed = 5;
    options.session.speed = 1.0;
    options.session.host = "testhost";
    return options;
}

// A recording of the simulated drive, the way --record makes one, with at least count events.
void recordSimulatedDrive(const std::string& file, std::size_t count) {
    pyx::sim::SimulatedBaseband::Options simOptions;
    simOptions.seed = 5;
    simOptions.speed = 500.0;
    simOptions.startTimeMs = 1'700'000'000'000ULL;
    pyx::sim::SimulatedBaseband sim(simOptions);
    std::ifstream config(std::string(PYXON_RESOURCE_DIR) + "/oru_test_lte.deviceconfig");
    const std::string text{std::istreambuf_iterator<char>(config),
                           std::istreambuf_iterator<char>()};
    ASSERT_EQ(
        sim.performCommand(velk::kCommandAddConfiguration,
                           Value(Dict{{velk::kKeyAppID, Value(std::int64_t{2})},
                                      {velk::kKeyPayload, Value(Bytes(text.begin(), text.end()))},
                                      {velk::kKeyPayloadType, Value(std::int64_t{0})}}),
                           nullptr)
            .code,
        velk::kCodeSuccess);
    RecordingWriter writer(writerOptions(file));
    std::atomic<std::size_t> seen{0};
    sim.startEvents([&](const std::string& stream, Value object) {
        writer.add(stream, std::move(object));
        ++seen;
    });
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(60);
    while (seen < count && std::chrono::steady_clock::now() < deadline)
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    sim.stopEvents();
}

using pyx::test::exportOf;
using pyx::test::info;
using pyx::test::Outcome;

std::vector<std::string> linesOf(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) {
        if (!line.empty() && line.back() == '\r') line.pop_back();
        lines.push_back(line);
    }
    return lines;
}

// RFC 4180 rows.
std::vector<std::vector<std::string>> csvRows(const std::string& text) {
    std::vector<std::vector<std::string>> rows;
    std::vector<std::string> row;
    std::string field;
    bool quoted = false;
    for (std::size_t i = 0; i < text.size(); ++i) {
        const char c = text[i];
        if (quoted) {
            if (c == '"' && i + 1 < text.size() && text[i + 1] == '"') {
                field += '"';
                ++i;
            } else if (c == '"') {
                quoted = false;
            } else {
                field += c;
            }
        } else if (c == '"') {
            quoted = true;
        } else if (c == ',') {
            row.push_back(field);
            field.clear();
        } else if (c == '\r' && i + 1 < text.size() && text[i + 1] == '\n') {
            row.push_back(field);
            field.clear();
            rows.push_back(row);
            row.clear();
            ++i;
        } else {
            field += c;
        }
    }
    return rows;
}

void writeSamples(const std::string& file, int count) {
    RecordingWriter writer(writerOptions(file));
    for (int n = 0; n < count; ++n)
        writer.add(n % 4 == 3 ? velk::kEventTrigger : velk::kEventMetric, sampleEvent(n));
}

TEST(RecordWriter, TheMetricIDAndPayloadComeFirstThenTheOtherKeysInTheirOrder) {
    pyx::MetricRecord record;
    record.set("kKeyProfileID", pyx::Value(std::int64_t{0}));
    record.set("kKeyPayload", pyx::Value(pyx::Bytes{0x0a, 0xff}));
    record.set("odd \"key\"", pyx::Value(std::string("text")));
    record.set("kKeyMetricID", pyx::Value(std::int64_t{3952132}));
    record.set("kKeyRatio", pyx::Value(0.5f));
    EXPECT_EQ(pyx::recordLine(record),
              "{\"kKeyMetricID\": 3952132, \"kKeyPayload\": \"0aff\", \"kKeyProfileID\": 0, "
              "\"odd \\\"key\\\"\": \"text\", \"kKeyRatio\": 0.5}");
    EXPECT_EQ(pyx::recordLine(pyx::MetricRecord{}), "{}");
    EXPECT_EQ(pyx::metricIDText(std::int64_t{0x3C4E04}), "0x3C4E04");
    EXPECT_EQ(pyx::metricIDText(std::optional<std::int64_t>{}), "(no metric ID)");
}

TEST(IsoTime, TimesAreWrittenInUtcWithNanosecondsAndReadBackInTheFormsGiven) {
    EXPECT_EQ(pyx::isoTime(0), "1970-01-01T00:00:00.000000000Z");
    EXPECT_EQ(pyx::isoTime(1'795'461'678'469'772'393), "2026-11-23T19:21:18.469772393Z");
    EXPECT_EQ(pyx::parseIsoTime("2026-11-23T19:21:18.469772393Z"), 1'795'461'678'469'772'393);
    EXPECT_EQ(pyx::parseIsoTime("2026-11-23 19:21:18.5"), 1'795'461'678'500'000'000);
    EXPECT_EQ(pyx::parseIsoTime("2026-11-23T21:21:18+02:00"), 1'795'461'678'000'000'000);
    EXPECT_EQ(pyx::parseIsoTime("2026-11-23T19:21Z"), 1'795'461'660'000'000'000);
    EXPECT_EQ(pyx::parseIsoTime("2026-11-23"), 1'795'392'000'000'000'000);
    EXPECT_FALSE(pyx::parseIsoTime("yesterday"));
    EXPECT_FALSE(pyx::parseIsoTime("2026-13-01"));
    EXPECT_FALSE(pyx::parseIsoTime("2026-11-23T19:21:18Zjunk"));
}

TEST(IsoTime, DatesThatDoNotExistAndZonesOutOfRangeAreNotTimes) {
    pyx::IsoTimeRefusal refusal = pyx::IsoTimeRefusal::OutOfRange;
    EXPECT_FALSE(pyx::parseIsoTime("2026-02-31", &refusal));
    EXPECT_EQ(refusal, pyx::IsoTimeRefusal::NotATime);
    EXPECT_FALSE(pyx::parseIsoTime("2026-02-29"));
    EXPECT_FALSE(pyx::parseIsoTime("2026-04-31"));
    EXPECT_FALSE(pyx::parseIsoTime("2026-00-10"));
    EXPECT_FALSE(pyx::parseIsoTime("2026-01-00"));
    EXPECT_EQ(pyx::parseIsoTime("2024-02-29"), 1'709'164'800'000'000'000);
    EXPECT_FALSE(pyx::parseIsoTime("2026-11-23T19:21+24:00"));
    EXPECT_FALSE(pyx::parseIsoTime("2026-11-23T19:21+02:60"));
    EXPECT_FALSE(pyx::parseIsoTime("2026-11-23T19:21-99:00"));
    EXPECT_EQ(pyx::parseIsoTime("2026-11-23T19:21-23:59"),
              1'795'461'660'000'000'000 + 86'340'000'000'000);
}

TEST(IsoTime, TimesBeyondWhatNanosecondsSince1970CanHoldAreRefusedAsOutOfRange) {
    pyx::IsoTimeRefusal refusal = pyx::IsoTimeRefusal::NotATime;
    EXPECT_FALSE(pyx::parseIsoTime("9999-12-31", &refusal));
    EXPECT_EQ(refusal, pyx::IsoTimeRefusal::OutOfRange);
    refusal = pyx::IsoTimeRefusal::NotATime;
    EXPECT_FALSE(pyx::parseIsoTime("0001-01-01", &refusal));
    EXPECT_EQ(refusal, pyx::IsoTimeRefusal::OutOfRange);
    // The last and the first nanosecond that fit, and one past each.
    constexpr auto kMax = std::numeric_limits<std::int64_t>::max();
    constexpr auto kMin = std::numeric_limits<std::int64_t>::min();
    EXPECT_EQ(pyx::isoTime(kMax), "2262-04-11T23:47:16.854775807Z");
    EXPECT_EQ(pyx::isoTime(kMin), "1677-09-21T00:12:43.145224192Z");
    EXPECT_EQ(pyx::parseIsoTime("2262-04-11T23:47:16.854775807Z"), kMax);
    EXPECT_EQ(pyx::parseIsoTime("1677-09-21T00:12:43.145224192Z"), kMin);
    EXPECT_FALSE(pyx::parseIsoTime("2262-04-11T23:47:16.854775808Z", &refusal));
    EXPECT_EQ(refusal, pyx::IsoTimeRefusal::OutOfRange);
    EXPECT_FALSE(pyx::parseIsoTime("1677-09-21T00:12:43.145224191Z"));
    EXPECT_EQ(pyx::isoTimeRange(),
              "1677-09-21T00:12:43.145224192Z to 2262-04-11T23:47:16.854775807Z");
}

TEST(ExportCommand, ATimeOutOfRangeOrADateThatDoesNotExistIsRefusedWithOneLine) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    {
        RecordingWriter writer(writerOptions(file));
        writer.add(velk::kEventMetric, sampleEvent(0));
    }
    pyx::ExportRequest request;
    request.file = file;
    request.from = "9999-12-31";
    Outcome run = exportOf(request);
    EXPECT_EQ(run.status, 2);
    EXPECT_EQ(run.out, "");
    EXPECT_EQ(run.err,
              "pyxonctl export: --from '9999-12-31' is outside the times a recording can hold, "
              "1677-09-21T00:12:43.145224192Z to 2262-04-11T23:47:16.854775807Z\n");
    request.from.reset();
    request.to = "2026-02-31";
    run = exportOf(request);
    EXPECT_EQ(run.status, 2);
    EXPECT_EQ(run.err,
              "pyxonctl export: --to '2026-02-31' is not a time; example: 2026-11-23T19:05:50Z "
              "(UTC without a zone)\n");
}

TEST(CsvText, FieldsWithCommasQuotesOrLineBreaksAreQuotedAsRfc4180Has) {
    std::string row;
    pyx::appendCsvRow(row, {"plain", "a,b", "say \"hi\"", "two\nlines", "", "-107"});
    EXPECT_EQ(row, "plain,\"a,b\",\"say \"\"hi\"\"\",\"two\nlines\",,-107\r\n");
    EXPECT_EQ(csvRows(row), (std::vector<std::vector<std::string>>{
                                {"plain", "a,b", "say \"hi\"", "two\nlines", "", "-107"}}));
}

TEST(InfoCommand, SaysHowManyEventsOfWhichKindsWhenAndFromWhichSessions) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    writeSamples(file, 12);
    {
        RecordingWriter writer(writerOptions(file, true));
        writer.add(velk::kEventMetric, sampleEvent(12));
    }
    const auto events = readAll(file);
    const Outcome run = info(file);
    ASSERT_EQ(run.status, 0) << run.err;
    EXPECT_EQ(run.err, "");
    const Json object = Json::parse(run.out);
    EXPECT_EQ(object["file"], file);
    EXPECT_EQ(object["events"], 13);
    EXPECT_EQ(object["first"], pyx::isoTime(events.front().wallNs));
    EXPECT_EQ(object["last"], pyx::isoTime(events.back().wallNs));
    EXPECT_DOUBLE_EQ(object["duration_s"].get<double>(),
                     static_cast<double>(events.back().wallNs - events.front().wallNs) / 1e9);
    EXPECT_EQ(object["kinds"], Json::parse(R"({"0x3C4E01":4,"0x3C4E04":5,"0x3CD302":4})"));
    EXPECT_EQ(object["format_version"], 2);
    ASSERT_EQ(object["sessions"].size(), 2u);
    EXPECT_EQ(object["sessions"][0]["source"], "sim");
    EXPECT_EQ(object["sessions"][0]["seed"], 5);
    EXPECT_EQ(object["sessions"][0]["program_version"], "0.1.0");
    EXPECT_EQ(object["sessions"][0]["host"], "testhost");
    EXPECT_EQ(object["sessions"][1]["source"], "modem:0");
    EXPECT_TRUE(object["sessions"][1]["seed"].is_null());
}

TEST(InfoCommand, ARecordingWithoutEventsHasNoFirstOrLastTime) {
    const TempDir dir;
    const std::string file = dir.file("empty.pyxrec");
    { RecordingWriter writer(writerOptions(file)); }
    const Outcome run = info(file);
    ASSERT_EQ(run.status, 0) << run.err;
    const Json object = Json::parse(run.out);
    EXPECT_EQ(object["events"], 0);
    EXPECT_TRUE(object["first"].is_null());
    EXPECT_EQ(object["duration_s"], 0.0);
}

// The bad files of every kind, by what they are.
std::vector<std::pair<std::string, std::string>> badFiles(const TempDir& dir) {
    const std::string text = dir.file("notes.txt");
    std::ofstream(text) << std::string(500, 'x');
    const std::string future = dir.file("future.pyxrec");
    writeSamples(future, 2);
    {
        // A later format version, as a newer program would write it.
        const std::string command = "sqlite3 '" + future + "' 'PRAGMA user_version=9;'";
        EXPECT_EQ(std::system(command.c_str()), 0);
    }
    return {
        {dir.file("gone.pyxrec"), "no such file"},
        {dir.path().string(), "is a directory, not a recording"},
        {text, "not a Pyxon recording (not an SQLite database)"},
        {future, "written in format version 9 by a newer Pyxon; this one reads up to version 2"}};
}

// What info says of a bad file: it reads DIAG captures too, so a file that is not a recording
// is said to be neither.
std::string infoSays(const std::string& what) {
    return what.starts_with("not a Pyxon recording")
               ? what + " nor a DIAG capture (no DIAG frame in it)"
               : what;
}

TEST(InfoCommand, EachBadFileGivesOneLineNamingItAndANonZeroExit) {
    const TempDir dir;
    for (const auto& [file, what] : badFiles(dir)) {
        const Outcome run = info(file);
        EXPECT_EQ(run.status, 1) << file;
        EXPECT_EQ(run.out, "") << file;
        EXPECT_EQ(run.err, "pyxonctl info: " + file + ": " + infoSays(what) + "\n");
    }
}

TEST(ExportCommand, JsonlHoldsEveryRecordedMetricEventInOrderAsListenPrintsIt) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    writeSamples(file, 40);
    pyx::ExportRequest request;
    request.file = file;
    const Outcome run = exportOf(request);
    ASSERT_EQ(run.status, 0) << run.err;
    EXPECT_EQ(run.err, "");
    std::vector<std::string> expected;
    for (const auto& event : readAll(file)) {
        if (event.stream != velk::kEventMetric) continue;
        expected.push_back("{\"time\": \"" + pyx::isoTime(event.wallNs) + "\", " +
                           pyx::recordLine(pyx::metricRecordFromEvent(event.object)).substr(1));
    }
    EXPECT_EQ(expected.size(), 30u);
    EXPECT_EQ(linesOf(run.out), expected);
}

TEST(ExportCommand, KindFromAndToSelectTheEvents) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    writeSamples(file, 40);
    const auto events = readAll(file);
    pyx::ExportRequest request;
    request.file = file;
    request.kinds = {"0x3C4E04", "3cd302"};
    request.from = pyx::isoTime(events[4].wallNs);
    request.to = pyx::isoTime(events[30].wallNs);
    const Outcome run = exportOf(request);
    ASSERT_EQ(run.status, 0) << run.err;
    std::size_t expected = 0;
    for (const auto& event : events) {
        const auto id = event.object.asDict().find(velk::kKeyMetricID)->asInt();
        if (event.stream == velk::kEventMetric && (id == 0x3C4E04 || id == 0x3CD302) &&
            event.wallNs >= events[4].wallNs && event.wallNs <= events[30].wallNs)
            ++expected;
    }
    const auto lines = linesOf(run.out);
    EXPECT_EQ(lines.size(), expected);
    for (const auto& line : lines) {
        const auto id = Json::parse(line)["kKeyMetricID"].get<std::int64_t>();
        EXPECT_TRUE(id == 0x3C4E04 || id == 0x3CD302) << line;
    }
}

TEST(ExportCommand, ABadKindTimeOrFormatIsRefusedWithOneLine) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    writeSamples(file, 2);
    pyx::ExportRequest request;
    request.file = file;
    request.kinds = {"rsrp"};
    Outcome run = exportOf(request);
    EXPECT_EQ(run.status, 2);
    EXPECT_EQ(run.err,
              "pyxonctl export: --kind 'rsrp' is not a metric ID in hex; example: --kind "
              "0x3C4E04\n");
    request.kinds.clear();
    request.from = "last tuesday";
    run = exportOf(request);
    EXPECT_EQ(run.status, 2);
    EXPECT_EQ(run.err,
              "pyxonctl export: --from 'last tuesday' is not a time; example: "
              "2026-11-23T19:05:50Z (UTC without a zone)\n");
    request.from.reset();
    request.format = "xml";
    run = exportOf(request);
    EXPECT_EQ(run.status, 2);
    EXPECT_EQ(run.err, "pyxonctl export: --format 'xml': expected jsonl, csv, geojson or kml\n");
}

TEST(ExportCommand, EachBadFileGivesOneLineNamingItAndANonZeroExit) {
    const TempDir dir;
    for (const auto& [file, what] : badFiles(dir)) {
        for (const char* format : {"jsonl", "csv"}) {
            pyx::ExportRequest request;
            request.file = file;
            request.format = format;
            const Outcome run = exportOf(request);
            EXPECT_EQ(run.status, 1) << file;
            EXPECT_EQ(run.out, "") << file;
            EXPECT_EQ(run.err, "pyxonctl export: " + file + ": " + what + "\n");
        }
    }
}

TEST(ExportCommand, AnOutputThatCannotBeWrittenIsSaidAndExitsNonZero) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    {
        RecordingWriter writer(writerOptions(file));
        for (int n = 0; n < 10; ++n) writer.add(velk::kEventMetric, sampleEvent(n));
    }
    pyx::ExportRequest request;
    request.file = file;
    std::ofstream full("/dev/full");
    ASSERT_TRUE(full.is_open());
    std::ostringstream err;
    EXPECT_EQ(pyx::runExport(request, full, err), 1);
    EXPECT_EQ(err.str(), "pyxonctl export: writing the output failed\n");
}

TEST(ExportCommand, ADamagedFileExportsWhatCanBeReadAndSaysHowMuch) {
    const TempDir dir;
    const std::string file = dir.file("cut.pyxrec");
    {
        RecordingWriter writer(writerOptions(file));
        for (int n = 0; n < 3000; ++n) writer.add(velk::kEventMetric, sampleEvent(n, 40));
    }
    std::filesystem::resize_file(file, std::filesystem::file_size(file) / 2);
    pyx::ExportRequest request;
    request.file = file;
    const Outcome run = exportOf(request);
    EXPECT_EQ(run.status, 1);
    const auto lines = linesOf(run.out);
    ASSERT_GT(lines.size(), 500u);
    ASSERT_LT(lines.size(), 3000u);
    for (std::size_t i = 0; i < lines.size(); ++i)
        ASSERT_EQ(Json::parse(lines[i])["kKeyTriggerRef"], i);
    const auto errLines = linesOf(run.err);
    ASSERT_EQ(errLines.size(), 1u) << run.err;
    EXPECT_TRUE(errLines[0].starts_with("pyxonctl export: " + file + ": damaged after event ") ||
                errLines[0].starts_with("pyxonctl export: " + file + ": damaged at event "))
        << errLines[0];
    const std::string tail =
        "; exported the " + std::to_string(lines.size()) + " events read before it";
    EXPECT_TRUE(errLines[0].ends_with(tail)) << errLines[0];
}

TEST(ExportCommand, CsvHasOneColumnPerFieldOfTheKindsAskedForInFirstSeenOrder) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    recordSimulatedDrive(file, 600);
    pyx::ExportRequest request;
    request.file = file;
    request.format = "csv";
    request.kinds = {"0x3C4F6A", "0x3C4E04"};
    const Outcome run = exportOf(request);
    ASSERT_EQ(run.status, 0) << run.err;
    EXPECT_EQ(run.err, "");
    const auto rows = csvRows(run.out);
    ASSERT_GT(rows.size(), 10u);
    const auto& header = rows[0];
    ASSERT_GE(header.size(), 4u);
    EXPECT_EQ(std::vector<std::string>(header.begin(), header.begin() + 4),
              (std::vector<std::string>{"time", "metric", "property", "timestamp"}));
    const auto has = [&](const std::string& name) {
        return std::find(header.begin(), header.end(), name) != header.end();
    };
    EXPECT_TRUE(has("inst_values.0.rsrp0"));
    EXPECT_TRUE(has("avg_values.sinr1"));
    EXPECT_TRUE(has("state"));  // of the RRC state
    EXPECT_EQ(std::set<std::string>(header.begin(), header.end()).size(), header.size());
    std::set<std::string> properties;
    for (std::size_t i = 1; i < rows.size(); ++i) {
        ASSERT_EQ(rows[i].size(), header.size()) << i;
        EXPECT_TRUE(rows[i][1] == "0x3C4F6A" || rows[i][1] == "0x3C4E04") << rows[i][1];
        EXPECT_TRUE(pyx::parseIsoTime(rows[i][0])) << rows[i][0];
        properties.insert(rows[i][2]);
    }
    EXPECT_EQ(properties, (std::set<std::string>{"myLTERsrpRsrqSinrDict", "myLTERRCStateDict"}));
}

#ifdef PYXON_HAVE_SCREEN_COMMAND
TEST(ExportCommand, CsvServingRsrpMatchesWhatTheScreenShowsFromTheJsonlExport) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    recordSimulatedDrive(file, 600);

    pyx::ExportRequest request;
    request.file = file;
    const Outcome jsonl = exportOf(request);
    ASSERT_EQ(jsonl.status, 0) << jsonl.err;
    std::istringstream records(jsonl.out);
    std::ostringstream screen, screenErr;
    const pyx::CapturedLines storeLines(pyx::standardOutputSink());
    ASSERT_EQ(pyx::runScreen({"LTE", "Serving Cell Meas", false}, records, screen, screenErr), 0);
    std::string shown;
    const Json shownScreen = Json::parse(screen.str());
    for (const auto& row : shownScreen["sections"][0]["rows"])
        if (row["text"] == "rsrp0") shown = row["detail"].get<std::string>();
    ASSERT_FALSE(shown.empty()) << screen.str();

    request.format = "csv";
    request.kinds = {"0x3C4F6A"};
    const Outcome csv = exportOf(request);
    ASSERT_EQ(csv.status, 0) << csv.err;
    const auto rows = csvRows(csv.out);
    ASSERT_GT(rows.size(), 1u);
    const auto column = std::find(rows[0].begin(), rows[0].end(), "inst_values.0.rsrp0");
    ASSERT_NE(column, rows[0].end());
    // The screen shows the latest measurement: the last row's.
    EXPECT_EQ(rows.back()[static_cast<std::size_t>(column - rows[0].begin())], shown);
}
#endif

TEST(ExportCommand, ARecordTheStoreRefusesIsSkippedWithOneLineAndCounted) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    std::int64_t badID = 0;
    {
        RecordingWriter writer(writerOptions(file));
        writer.add(velk::kEventMetric,
                   Value(Dict{{velk::kKeyMetricID, Value(kRrcStateKind)},
                              {velk::kKeyPayload, Value(Bytes{0xff, 0xff, 0xff})}}));
        writer.flush();
        badID = readAll(file).back().id;
    }
    pyx::ExportRequest request;
    request.file = file;
    request.format = "csv";
    const Outcome run = exportOf(request);
    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(linesOf(run.out), (std::vector<std::string>{"time,metric,property"}));
    EXPECT_EQ(linesOf(run.err),
              (std::vector<std::string>{
                  "pyxonctl export: event " + std::to_string(badID) +
                      " skipped: 0x3C4E04: does not decode as KCellularLteRrcState: truncated "
                      "varint at byte 0",
                  "pyxonctl export: 1 of 1 records were refused by the store and skipped"}));
    static_cast<void>(kRsrpKind);
}

// Runs the built pyxonctl; stdout and stderr apart.
Outcome program(const std::string& arguments) {
    const auto run =
        pyx::test::ProgramRun::shell(std::string("'") + PYXONCTL_PATH + "' " + arguments);
    return Outcome{run.exitCode, run.out, run.err};
}

TEST(RecordingPrograms, InfoExportAndReplayOfABadFileExitNonZeroWithOneLine) {
    const TempDir dir;
    for (const auto& [file, what] : badFiles(dir)) {
        const Outcome infoRun = program("info '" + file + "'");
        EXPECT_EQ(infoRun.status, 1);
        EXPECT_EQ(infoRun.err, "pyxonctl info: " + file + ": " + infoSays(what) + "\n");
        const Outcome exportRun = program("export '" + file + "' --format csv");
        EXPECT_EQ(exportRun.status, 1);
        EXPECT_EQ(exportRun.err, "pyxonctl export: " + file + ": " + what + "\n");
        const Outcome replay = program("listen --source 'replay:" + file + "'");
        EXPECT_EQ(replay.status, 2);
        EXPECT_EQ(replay.err, "pyxonctl listen: --source replay: " + file + ": " + what + "\n");
    }
}

TEST(RecordingPrograms, ListenOnADamagedRecordingEndsAndExitsNonZero) {
    const TempDir dir;
    const std::string file = dir.file("cut.pyxrec");
    recordSimulatedDrive(file, 3000);
    std::filesystem::resize_file(file, std::filesystem::file_size(file) / 2);
    // --duration only bounds a run that would otherwise never end.
    const Outcome replay =
        program("listen --source 'replay:" + file + "' --speed 0 --duration 120");
    EXPECT_EQ(replay.status, 1) << replay.err;
    EXPECT_NE(replay.err.find("replay " + file + ": damaged "), std::string::npos) << replay.err;
    EXPECT_NE(replay.err.find("; the replay stops here\n"), std::string::npos) << replay.err;
    EXPECT_FALSE(linesOf(replay.out).empty());
}

TEST(RecordingPrograms, ExportToAFullDiskSaysSoAndExitsNonZero) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    {
        RecordingWriter writer(writerOptions(file));
        for (int n = 0; n < 100; ++n) writer.add(velk::kEventMetric, sampleEvent(n));
    }
    for (const char* format : {"jsonl", "csv"}) {
        const Outcome run = program("export '" + file + "' --format " + format + " > /dev/full");
        EXPECT_EQ(run.status, 1) << format;
        // csv says first which of the sample records the store refused.
        EXPECT_TRUE(run.err.ends_with("\npyxonctl export: writing the output failed\n") ||
                    run.err == "pyxonctl export: writing the output failed\n")
            << run.err;
    }
}

TEST(RecordingPrograms, ListenRecordsWhatItPrintsAndAReplayPrintsTheSameAgain) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    const Outcome live = program("listen --speed 50 --count 200 --record '" + file + "'");
    ASSERT_EQ(live.status, 0) << live.err;
    const Outcome refused = program("listen --count 1 --record '" + file + "'");
    EXPECT_EQ(refused.status, 2);
    EXPECT_EQ(refused.err, "pyxonctl listen: --record " + file +
                               ": exists already; give --append to add a session to it, or "
                               "choose another name\n");
    const Outcome replay = program("listen --source 'replay:" + file + "' --speed 0");
    ASSERT_EQ(replay.status, 0) << replay.err;
    // The recording may hold a few events more than were printed (on their way at the end).
    const auto printed = linesOf(live.out);
    const auto replayed = linesOf(replay.out);
    ASSERT_EQ(printed.size(), 200u);
    ASSERT_GE(replayed.size(), printed.size());
    EXPECT_TRUE(std::equal(printed.begin(), printed.end(), replayed.begin()));
    const Outcome appended = program("listen --count 10 --record '" + file + "' --append");
    ASSERT_EQ(appended.status, 0) << appended.err;
    EXPECT_EQ(Json::parse(program("info '" + file + "'").out)["sessions"].size(), 2u);
}

}  // namespace
