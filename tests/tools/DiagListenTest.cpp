// pyxonctl listen on the DIAG source, run as a program: a capture written here plays to its end
// and exits 0 with a JSON line per decoded event, the screens show what it held, the refusals
// are one line, and the peers' captures (when ../shared/diag is there) each play through.
#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <filesystem>
#include <nlohmann/json.hpp>
#include <sstream>
#include <string>
#include <vector>

#include "tests/recordings/TempDir.h"
#include "tests/sources/diag/support/DiagVectors.h"
#include "tests/sources/diag/transport/WcdmaCapture.h"
#include "tests/support/ProgramRun.h"

namespace {

using Json = nlohmann::ordered_json;
using pyx::diag::test::CapturedCell;
using pyx::test::ProgramRun;
using pyx::testing::TempDir;

// Runs a shell command line (pyxonctl is $PYXONCTL in it) and collects its output.
ProgramRun shell(const std::string& commandLine) {
    return ProgramRun::shell(std::string("PYXONCTL='") + PYXONCTL_PATH + "'; " + commandLine);
}

std::vector<std::string> lines(const std::string& text) {
    std::vector<std::string> out;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) out.push_back(line);
    return out;
}

// A capture of count WCDMA cells (PSC 1..count), 300 ms apart.
std::string writeCapture(const TempDir& dir, std::uint32_t count) {
    std::vector<CapturedCell> cells;
    for (std::uint32_t n = 1; n <= count; ++n)
        cells.push_back({1700000000000ULL + (n - 1) * 300, 10663, n});
    const std::string file = dir.file("drive.qmdl");
    pyx::diag::test::writeBytes(file, pyx::diag::test::wcdmaCapture(cells));
    return file;
}

constexpr std::int64_t kUmtsCellInfo = 0x3C300C;

TEST(DiagListen, ACaptureAtSpeedZeroPrintsItsEventsAndExitsZero) {
    const TempDir dir;
    const std::string file = writeCapture(dir, 5);
    const ProgramRun run = shell("\"$PYXONCTL\" listen --source 'diag:" + file + "' --speed 0");
    EXPECT_EQ(run.exitCode, 0) << run.err;
    const auto printed = lines(run.out);
    ASSERT_EQ(printed.size(), 5U) << run.out;
    for (const auto& line : printed) {
        const Json record = Json::parse(line);
        EXPECT_EQ(record["kKeyMetricID"], kUmtsCellInfo) << line;
        EXPECT_TRUE(record["kKeyPayload"].is_string()) << line;
    }
    // stderr: the one summary line of the capture's end.
    EXPECT_EQ(run.err, "diag " + file +
                           ": end of the capture: 5 packets decoded, 0 not decoded, 0 bad "
                           "frames; the screens keep the last values\n");
}

TEST(DiagListen, ACaptureAtSpeedOneEndsTooWithItsEventsInOrder) {
    const TempDir dir;
    const std::string file = writeCapture(dir, 3);
    const ProgramRun run =
        shell("\"$PYXONCTL\" listen --source 'diag:" + file + "' | \"$PYXONCTL\" decode");
    EXPECT_EQ(run.exitCode, 0) << run.err;
    std::vector<std::string> pscs;
    std::vector<std::string> times;
    for (const auto& line : lines(run.out)) {
        const Json decoded = Json::parse(line);
        if (!decoded.contains("dict") || !decoded["dict"].contains("psc")) continue;
        pscs.push_back(decoded["dict"]["psc"].dump());
        times.push_back(decoded["dict"]["timestamp"].dump());
    }
    EXPECT_EQ(pscs, (std::vector<std::string>{"1", "2", "3"})) << run.out;
    // Each message carries its packet's own time (1700000000000 ms, then 300 ms apart).
    ASSERT_FALSE(times.empty());
    EXPECT_EQ(times.front(), "\"2023-11-14 22:13:20 GMT\"") << run.out;
}

TEST(DiagListen, PipedIntoScreenShowsTheServingCell) {
    const TempDir dir;
    const std::string file = writeCapture(dir, 4);
    const ProgramRun run = shell("\"$PYXONCTL\" listen --source 'diag:" + file +
                                 "' --speed 0 | \"$PYXONCTL\" screen UMTS \"Serving Cell Info\"");
    EXPECT_EQ(run.exitCode, 0) << run.err;
    const Json screen = Json::parse(run.out);
    EXPECT_EQ(screen["key"], "UMTS Serving Cell Info");
    std::vector<std::pair<std::string, std::string>> rows;
    for (const auto& section : screen["sections"])
        for (const auto& row : section["rows"])
            if (row["text"].is_string() && row["detail"].is_string())
                rows.emplace_back(row["text"], row["detail"]);
    const auto shows = [&rows](const std::string& text, const std::string& detail) {
        return std::find(rows.begin(), rows.end(), std::pair{text, detail}) != rows.end();
    };
    EXPECT_TRUE(shows("dl_uarfcn", "10663")) << run.out;
    EXPECT_TRUE(shows("psc", "4")) << run.out;  // the last cell
}

TEST(DiagListen, RecordKeepsTheCapturesEventsAsAReplaysSession) {
    const TempDir dir;
    const std::string file = writeCapture(dir, 5);
    const std::string recording = dir.file("drive.pyxrec");
    const ProgramRun run =
        shell("\"$PYXONCTL\" listen --source 'diag:" + file + "' --speed 0 --record '" + recording +
              "' > /dev/null && \"$PYXONCTL\" info '" + recording + "'");
    EXPECT_EQ(run.exitCode, 0) << run.err;
    const Json info = Json::parse(run.out);
    EXPECT_EQ(info["events"], 5);
    EXPECT_EQ(info["kinds"]["0x3C300C"], 5);
    EXPECT_EQ(info["sessions"][0]["source"], "diag:" + file);
    EXPECT_EQ(info["sessions"][0]["speed"], 0.0);
}

TEST(DiagListen, QmdlWithoutALiveDiagSourceIsOneLine) {
    const TempDir dir;
    const std::string file = writeCapture(dir, 1);
    for (const std::string& source : {std::string("sim"), "diag:" + file}) {
        const ProgramRun run =
            shell("\"$PYXONCTL\" listen --source '" + source + "' --qmdl kept.qmdl");
        EXPECT_EQ(run.exitCode, 2) << source;
        EXPECT_EQ(run.out, "") << source;
        EXPECT_EQ(run.err,
                  "pyxonctl listen: --qmdl kept.qmdl: only with a live diag source "
                  "(--source diag or diag:PORT), not with --source " +
                      source + "\n");
    }
}

TEST(DiagListen, AMissingCaptureIsOneLine) {
    const TempDir dir;
    const ProgramRun run =
        shell("\"$PYXONCTL\" listen --source 'diag:" + dir.file("none.qmdl") + "' --speed 0");
    EXPECT_EQ(run.exitCode, 2);
    EXPECT_EQ(run.err, "pyxonctl listen: --source diag:" + dir.file("none.qmdl") +
                           ": no such file (a capture must exist; a port under /dev/ that is "
                           "not there yet is waited for)\n");
}

TEST(DiagListen, HelpExplainsTheDiagFormsAndQmdlWithExamples) {
    const ProgramRun run = shell("\"$PYXONCTL\" listen --help");
    EXPECT_EQ(run.exitCode, 0);
    for (const char* text :
         {"diag:PORT", "diag:FILE", "--qmdl FILE", "example: --source diag:/dev/ttyUSB0",
          "pyxonctl listen --source diag:drive.qmdl --speed 0 | pyxonctl screen UMTS"})
        EXPECT_NE(run.out.find(text), std::string::npos) << text;
}

// The peers' captures: each one's file name, or one "(absent)" without ../shared/diag.
std::vector<std::string> sharedCaptures() {
    std::vector<std::string> names;
    std::error_code error;
    const auto folder = pyx::diag::test::sharedDiag() / "captures";
    for (const auto& entry : std::filesystem::directory_iterator(folder, error)) {
        const auto extension = entry.path().extension();
        if (entry.is_regular_file() &&
            (extension == ".mi2log" || extension == ".qmdl" || extension == ".bin"))
            names.push_back(entry.path().filename().string());
    }
    std::sort(names.begin(), names.end());
    if (names.empty()) names.emplace_back("(absent)");
    return names;
}

class SharedCapture : public ::testing::TestWithParam<std::string> {};

TEST_P(SharedCapture, PlaysThroughListenToItsEndAndExitsZero) {
    PYX_NEED_SHARED_DIAG();
    const std::string file = (pyx::diag::test::sharedDiag() / "captures" / GetParam()).string();
    const ProgramRun run =
        shell("\"$PYXONCTL\" listen --source 'diag:" + file + "' --speed 0 > /dev/null");
    EXPECT_EQ(run.exitCode, 0) << run.err;
    EXPECT_NE(run.err.find("diag " + file + ": end of the capture: "), std::string::npos)
        << run.err;
}

INSTANTIATE_TEST_SUITE_P(Captures, SharedCapture, ::testing::ValuesIn(sharedCaptures()),
                         [](const ::testing::TestParamInfo<std::string>& capture) {
                             std::string name;
                             for (const char c : capture.param)
                                 name += std::isalnum(static_cast<unsigned char>(c)) ? c : '_';
                             return name;
                         });

TEST(SharedCaptures, AllTwelveAreThere) {
    PYX_NEED_SHARED_DIAG();
    EXPECT_EQ(sharedCaptures().size(), 12U);
}

}  // namespace
