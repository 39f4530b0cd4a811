// pyxonctl screen: records in, the screen of one menu pair out as one JSON object; in process
// and as the program itself.
#include <gtest/gtest.h>
#include <sys/wait.h>

#include <array>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <memory>
#include <nlohmann/json.hpp>
#include <sstream>
#include <string>

#include "StoreFeed.h"
#include "messages/Messages.h"
#include "tools/ScreenCommand.h"

namespace pyx {
namespace {

using Json = nlohmann::json;

std::string line(std::int64_t metricID, const Bytes& payload) {
    return R"({"kKeyMetricID": )" + std::to_string(metricID) + R"(, "kKeyPayload": ")" +
           hexString(payload) + "\"}";
}

std::string cdrxLine() {
    KCellularLteCdrxConfig m;
    m.setTimestamp(test::kTimestamp);
    m.setOnDurationMs(10);
    return line(3952152, m.data());
}

std::string bearersLine(int count) {
    KCellularActivatedBearerContexts m;
    m.setTimestamp(test::kTimestamp);
    for (int i = 0; i < count; ++i) {
        auto bearer = std::make_shared<BearerContext>();
        bearer->setCid(static_cast<std::uint32_t>(i + 5));
        m.addBearerContext(bearer);
    }
    return line(3986701, m.data());
}

struct Answer {
    Json json;
    std::string err;
};

Answer screen(const std::string& group, const std::string& category, const std::string& input,
              bool third = false) {
    std::istringstream in(input);
    std::ostringstream out;
    std::ostringstream err;
    EXPECT_EQ(runScreen(ScreenRequest{group, category, third}, in, out, err), 0);
    return Answer{Json::parse(out.str()), err.str()};
}

TEST(ScreenCommand, DictionaryCategoryShowsOneRowPerEntry) {
    const Answer a = screen("LTE", "C-DRX", cdrxLine() + "\n");
    EXPECT_EQ(a.json, Json::parse(R"({"key": "LTE C-DRX", "sections": [{"title": null, "rows": [
        {"text": "timestamp", "detail": "2017-07-14 02:40:00 GMT"},
        {"text": "on_duration_ms", "detail": "10"}]}]})"));
    EXPECT_EQ(a.err, "");
}

TEST(ScreenCommand, DictionaryCategoryBeforeItsMetricLeavesTheRowUnset) {
    const Answer a = screen("LTE", "C-DRX", "");
    EXPECT_EQ(a.json, Json::parse(R"({"key": "LTE C-DRX", "sections": [{"title": null,
        "rows": [{"text": null, "detail": null}]}]})"));
}

TEST(ScreenCommand, ListCategoryShowsOneTitledSectionPerEntry) {
    const Answer a = screen("GSM", "Active Bearers", bearersLine(2) + "\n");
    ASSERT_EQ(a.json["sections"].size(), 2U);
    EXPECT_EQ(a.json["key"], "GSM Active Bearers");
    EXPECT_EQ(a.json["sections"][0]["title"], "PDP 0");
    EXPECT_EQ(a.json["sections"][1]["title"], "PDP 1");
    EXPECT_EQ(a.json["sections"][1]["rows"][0], Json::parse(R"({"text": "cid", "detail": "6"})"));
}

TEST(ScreenCommand, UnknownKeyComesBackLater) {
    const Answer a = screen("Device Info", "IMSI", cdrxLine());
    EXPECT_EQ(a.json, Json::parse(R"({"key": "Device Info IMSI", "sections": [{"title": null,
        "rows": [{"text": "Come back later", "detail": "Come back later"}]}]})"));
}

TEST(ScreenCommand, ThirdLevelShowsOneUnsetRow) {
    const Answer a = screen("LTE", "C-DRX", cdrxLine(), true);
    EXPECT_EQ(a.json, Json::parse(R"({"key": "LTE C-DRX", "sections": [{"title": null,
        "rows": [{"text": null, "detail": null}]}]})"));
}

TEST(ScreenCommand, RefusedRecordsAreReportedOneLineEachAndSkipped) {
    const std::string input = "not json\n" + line(3952152, Bytes{0xff, 0xff}) + "\n\n" +
                              cdrxLine() + "\n" + R"({"kKeyPayload": "00"})" + "\n";
    const Answer a = screen("LTE", "C-DRX", input);
    EXPECT_EQ(a.json["sections"][0]["rows"].size(), 2U);
    std::istringstream err(a.err);
    std::string first;
    std::string second;
    std::string third;
    std::getline(err, first);
    std::getline(err, second);
    std::getline(err, third);
    EXPECT_EQ(first.rfind("pyxonctl screen: line 1 skipped: ", 0), 0U) << first;
    EXPECT_EQ(second.rfind("pyxonctl screen: line 2 skipped: 0x3C4E18: ", 0), 0U) << second;
    EXPECT_EQ(third.rfind("pyxonctl screen: line 5 skipped: ", 0), 0U) << third;
    EXPECT_TRUE(err.eof() || err.peek() == EOF);
}

// The program itself: stdin from a file, stdout and stderr captured.
struct ProgramRun {
    int status = -1;
    std::string out;
    std::string err;
};

std::string slurp(const std::filesystem::path& file) {
    std::ifstream in(file);
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

ProgramRun runProgram(const std::string& arguments, const std::string& input) {
    const auto dir =
        std::filesystem::temp_directory_path() / ("pyxonctl-screen-" + std::to_string(::getpid()));
    std::filesystem::create_directories(dir);
    std::ofstream(dir / "in.jsonl") << input;
    const std::string command = std::string(PYXONCTL) + " screen " + arguments + " < " +
                                (dir / "in.jsonl").string() + " > " + (dir / "out").string() +
                                " 2> " + (dir / "err").string();
    ProgramRun run;
    const int status = std::system(command.c_str());
    run.status = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    run.out = slurp(dir / "out");
    run.err = slurp(dir / "err");
    std::filesystem::remove_all(dir);
    return run;
}

TEST(ScreenCommandProgram, DictionaryCategory) {
    const ProgramRun run = runProgram("-v LTE C-DRX", cdrxLine() + "\n");
    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(run.out,
              R"({"key":"LTE C-DRX","sections":[{"title":null,"rows":[{"text":"timestamp",)"
              R"("detail":"2017-07-14 02:40:00 GMT"},{"text":"on_duration_ms","detail":"10"}]}]})"
              "\n");
    // With -v the store's own lines went to stderr.
    EXPECT_NE(run.err.find("Received Valid Metric"), std::string::npos);
    // Without, stderr stays empty.
    const ProgramRun quiet = runProgram("LTE C-DRX", cdrxLine() + "\n");
    EXPECT_EQ(quiet.out, run.out);
    EXPECT_EQ(quiet.err, "");
}

TEST(ScreenCommandProgram, ListCategory) {
    const ProgramRun run = runProgram("'UMTS' 'Active Bearers'", bearersLine(3) + "\n");
    EXPECT_EQ(run.status, 0);
    const Json json = Json::parse(run.out);
    ASSERT_EQ(json["sections"].size(), 3U);
    EXPECT_EQ(json["sections"][2]["title"], "PDP 2");
}

TEST(ScreenCommandProgram, UnknownKey) {
    const ProgramRun run = runProgram("GSM 'GSM GPRS Config'", "");
    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(run.out, R"({"key":"GSM GSM GPRS Config","sections":[{"title":null,"rows":[{"text":)"
                       R"("Come back later","detail":"Come back later"}]}]})"
                       "\n");
}

TEST(ScreenCommandProgram, AbsentLteServingCellInfoPrintsItsLineOnStderrWithVerbose) {
    const ProgramRun run = runProgram("LTE 'Serving Cell Info' --verbose", "");
    EXPECT_EQ(run.status, 0);
    EXPECT_NE(run.err.find("You are screwed\n"), std::string::npos);
    EXPECT_EQ(run.out.find("screwed"), std::string::npos);
}

TEST(ScreenCommandProgram, MissingCategoryIsAUsageError) {
    const ProgramRun run = runProgram("LTE", "");
    EXPECT_NE(run.status, 0);
    EXPECT_EQ(run.out, "");
    EXPECT_FALSE(run.err.empty());
}

}  // namespace
}  // namespace pyx
