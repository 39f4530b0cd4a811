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
#include "tests/tools/PyxonctlShell.h"

namespace {

using Json = nlohmann::ordered_json;
using pyx::diag::test::CapturedCell;
using pyx::test::ProgramRun;
using pyx::testing::TempDir;

ProgramRun shell(const std::string& commandLine) {
    return pyx::test::pyxonctlShell(commandLine);
}

std::vector<std::string> lines(const std::string& text) {
    return pyx::test::linesOf(text);
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

// What one of the peers' captures shows once played to its end: the kinds listen prints, the
// bad frames its summary counts, and values of the screens, each checked by hand against the
// capture's last packet of that kind (decoded apart, with a script, from the layout the peers
// document: 0xB0C2's PCI, EARFCNs, band and TAC; 0xB193 v36's PCell EARFCN, PCI and RSRP per
// receive chain; 0xB139 v102's power word).
struct ScreenValue {
    std::string group;
    std::string category;
    std::string row;
    std::string detail;
};
struct CaptureCase {
    std::string file;
    std::vector<std::int64_t> kinds;  // sorted
    int badFrames = 0;
    std::vector<ScreenValue> values;
};

constexpr std::int64_t kScellInfo = 0x3C40C2, kRrcState = 0x3C4E04, kRsrp = 0x3C4F6A,
                       kTxPower = 0x3CD302, kCompCarr = 0x3CD30B, kIntraRat = 0x3CD30F,
                       kCaStatus = 0x3CD313, kSecondaryMeas = 0x3CD317, kMm = 0x3CD50A,
                       kGmm = 0x3CD50B, kEmm = 0x3CD50C, kBearers = 0x3CD50D;

const std::vector<CaptureCase>& captureCases() {
    static const std::vector<CaptureCase> cases = {
        // NR RRC OTA (0xB821) only, in multi-SIM wrappers: counted, nothing shown.
        {"mi-20201115_181843_Xiaomi-Mi10_46000.mi2log", {}, 0, {}},
        // Paging (0xB0C0 v26) of two subscriptions: the first decoded, nothing to show.
        {"mi-20201116_170453_Xiaomi-Mi10_46000.mi2log", {}, 0, {}},
        {"mi-attach_sample.mi2log",
         {kScellInfo, kRrcState, kEmm, kBearers},
         0,
         {{"LTE", "Serving Cell Info", "phy_cell_id", "312"},
          {"LTE", "Serving Cell Info", "dl_freq", "5230"},
          {"LTE", "Serving Cell Info", "freq_band_ind", "13"},
          {"LTE", "Serving Cell Info", "tracking_area_code", "58891"},
          {"LTE", "RRC State", "state", "KLTE_RRC_STATE_CONNECTED"},
          {"LTE", "NAS", "reg_status", "KREG_STATUS_NORMAL_SERVICE"}}},
        {"mi-bler_sample.mi2log",
         {kRrcState, kRsrp, kCompCarr, kCaStatus, kSecondaryMeas, kBearers},
         0,
         {{"LTE", "Serving Cell Meas", "phy_cell_id", "352"},
          {"LTE", "Serving Cell Meas", "rsrp0", "-128"},
          {"LTE", "Serving Cell Meas", "rsrp1", "-124"},
          {"LTE", "CA Status", "dl_earfcn", "3683"}}},
        {"mi-latency_sample.mi2log",
         {kTxPower},
         0,
         {{"LTE", "Tx Power", "pusch_tx_power", "15"}, {"LTE", "Tx Power", "subframe_index", "5"}}},
        {"mi-mobility_sample.mi2log",
         {kScellInfo, kRrcState, kEmm, kBearers},
         0,
         {{"LTE", "Serving Cell Info", "phy_cell_id", "255"},
          {"LTE", "Serving Cell Info", "dl_freq", "5780"},
          {"LTE", "Serving Cell Info", "tracking_area_code", "35633"}}},
        {"mi-offline_log_example.mi2log",
         {kScellInfo, kRrcState, kRsrp, kTxPower, kCompCarr, kIntraRat, kCaStatus, kSecondaryMeas,
          kMm, kGmm, kEmm, kBearers},
         0,
         {{"LTE", "Serving Cell Info", "phy_cell_id", "405"},
          {"LTE", "Serving Cell Info", "freq_band_ind", "17"},
          {"LTE", "Serving Cell Meas", "phy_cell_id", "405"},
          {"UMTS", "NAS GMM", "update_status", "GPRS_STATUS_UPDATED"}}},
        {"mi-unittest-att.mi2log",
         {kScellInfo, kRrcState, kRsrp, kCompCarr, kIntraRat, kCaStatus, kSecondaryMeas, kEmm},
         0,
         {{"LTE", "Serving Cell Info", "phy_cell_id", "185"},
          {"LTE", "Serving Cell Info", "tracking_area_code", "21512"},
          {"LTE", "Serving Cell Meas", "phy_cell_id", "185"},
          {"LTE", "Serving Cell Meas", "rsrp0", "-110"}}},
        {"mi-unittest-cmcc.mi2log",
         {kScellInfo, kRrcState, kMm, kGmm, kEmm, kBearers},
         1,  // cut at the file's start
         {{"LTE", "Serving Cell Info", "phy_cell_id", "337"},
          {"LTE", "Serving Cell Info", "dl_freq", "37900"},
          {"LTE", "Serving Cell Info", "freq_band_ind", "38"},
          {"UMTS", "NAS MM", "update_status", "STATUS_UPDATED"}}},
        {"mi-unittest-sprint.mi2log",
         {kScellInfo, kRrcState, kMm, kGmm, kEmm, kBearers},
         1,  // cut at the file's start
         {{"LTE", "Serving Cell Info", "phy_cell_id", "24"},
          {"LTE", "Serving Cell Info", "dl_freq", "8665"},
          {"LTE", "Serving Cell Info", "freq_band_ind", "25"},
          {"UMTS", "NAS MM", "update_status", "STATUS_NOT_UPDATED"}}},
        {"mi-unittest-tmobile.mi2log",
         {kScellInfo, kRrcState, kRsrp, kCompCarr, kIntraRat, kCaStatus, kSecondaryMeas, kMm, kGmm,
          kEmm},
         0,
         {{"LTE", "Serving Cell Info", "phy_cell_id", "42"},
          {"LTE", "Serving Cell Info", "dl_freq", "2075"},
          {"LTE", "CA Status", "pci", "42"}}},
        {"mi-volte_sample.mi2log",
         {kScellInfo, kRrcState, kEmm, kBearers},
         0,
         {{"LTE", "Serving Cell Info", "phy_cell_id", "30"},
          {"LTE", "Serving Cell Info", "tracking_area_code", "10502"},
          {"LTE", "Active Bearers", "nsapi", "7"}}},
    };
    return cases;
}

// Test names and failures name the capture.
void PrintTo(const CaptureCase& c, std::ostream* os) {
    *os << c.file;
}

// The detail of every row named row on the screen, in order.
std::vector<std::string> detailsOf(const std::string& screenJson, const std::string& row) {
    std::vector<std::string> details;
    const Json screen = Json::parse(screenJson);
    for (const auto& section : screen["sections"])
        for (const auto& r : section["rows"])
            if (r["text"] == row && r["detail"].is_string())
                details.push_back(r["detail"].get<std::string>());
    return details;
}

class SharedCapture : public ::testing::TestWithParam<CaptureCase> {};

TEST_P(SharedCapture, PlaysThroughListenToItsEndAndShowsWhatItHeld) {
    PYX_NEED_SHARED_DIAG();
    const CaptureCase& c = GetParam();
    const std::string file = (pyx::diag::test::sharedDiag() / "captures" / c.file).string();
    const TempDir dir;
    const std::string events = dir.file("events.jsonl");
    const ProgramRun run =
        shell("\"$PYXONCTL\" listen --source 'diag:" + file + "' --speed 0 > '" + events + "'");
    ASSERT_EQ(run.exitCode, 0) << run.err;
    EXPECT_NE(run.err.find("diag " + file + ": end of the capture: "), std::string::npos)
        << run.err;
    const std::string bad =
        std::to_string(c.badFrames) + (c.badFrames == 1 ? " bad frame;" : " bad frames;");
    EXPECT_NE(run.err.find(bad), std::string::npos) << run.err;

    std::vector<std::int64_t> kinds;
    const ProgramRun printed = shell("cat '" + events + "'");
    for (const auto& line : lines(printed.out))
        kinds.push_back(Json::parse(line)["kKeyMetricID"].get<std::int64_t>());
    std::sort(kinds.begin(), kinds.end());
    kinds.erase(std::unique(kinds.begin(), kinds.end()), kinds.end());
    EXPECT_EQ(kinds, c.kinds);

    for (const ScreenValue& v : c.values) {
        const ProgramRun screen =
            shell("\"$PYXONCTL\" screen '" + v.group + "' '" + v.category + "' < '" + events + "'");
        ASSERT_EQ(screen.exitCode, 0) << screen.err;
        const auto details = detailsOf(screen.out, v.row);
        EXPECT_NE(std::find(details.begin(), details.end(), v.detail), details.end())
            << v.group << " " << v.category << " " << v.row << ": " << screen.out;
    }
}

INSTANTIATE_TEST_SUITE_P(Captures, SharedCapture, ::testing::ValuesIn(captureCases()),
                         [](const ::testing::TestParamInfo<CaptureCase>& capture) {
                             std::string name;
                             for (const char c : capture.param.file)
                                 name += std::isalnum(static_cast<unsigned char>(c)) ? c : '_';
                             return name;
                         });

TEST(SharedCaptures, EachOneHasItsCase) {
    PYX_NEED_SHARED_DIAG();
    std::vector<std::string> named;
    for (const CaptureCase& c : captureCases()) named.push_back(c.file);
    EXPECT_EQ(named, sharedCaptures());
}

}  // namespace
