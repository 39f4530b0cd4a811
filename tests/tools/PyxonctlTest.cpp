// pyxonctl run as a program: JSON Lines in, JSON Lines out, the store's own lines on stderr.
#include <gtest/gtest.h>

#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <fstream>
#include <iterator>
#include <nlohmann/json.hpp>
#include <sstream>
#include <string>
#include <vector>

#include "tests/support/ProgramRun.h"

namespace {

using Json = nlohmann::ordered_json;
using pyx::test::ProgramRun;

// Runs pyxonctl with arguments, input on its stdin; collects stdout and stderr.
ProgramRun pyxonctl(const std::string& arguments, const std::string& input) {
    return ProgramRun::shell(std::string("'") + PYXONCTL_PATH + "' " + arguments, input);
}

std::vector<Json> jsonLines(const std::string& text) {
    std::vector<Json> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) lines.push_back(Json::parse(line));
    return lines;
}

TEST(Pyxonctl, DecodeWritesOneJsonLinePerRecordAndWithVerboseTheStoreLinesToStderr) {
    const ProgramRun run = pyxonctl("decode -v",
                                    "{\"kKeyMetricID\": 3986178, \"kKeyPayload\": "
                                    "\"08fbb0def7d32b12040814101e\", \"kKeyProfileID\": 1}\n"
                                    "{\"kKeyMetricID\": 3986177, \"kKeyPayload\": \"\"}\n"
                                    "{\"kKeyMetricID\": 3986178, \"kKeyPayload\": \"08FF\"}\n"
                                    "[\"not\", \"a\", \"record\"]\n"
                                    "{\"kKeyMetricID\": 3948738, \"kKeyPayload\": "
                                    "\"08fbb0def7d32b28643006\"}\n");
    EXPECT_EQ(run.exitCode, 0);
    const auto lines = jsonLines(run.out);
    ASSERT_EQ(lines.size(), 5U) << run.out;
    EXPECT_EQ(lines[0], Json::parse(R"({"metric":"0x3CD302","property":"myLTETxPowerDict",
        "dict":{"timestamp":"2017-07-14 02:40:00 GMT",
                "tx_power_info":[{"pucch_tx_power":10,"pusch_tx_power":15}]}})"));
    EXPECT_EQ(lines[1], Json::parse(R"({"metric":"0x3CD301","ignored":true})"));
    EXPECT_EQ(lines[2], Json::parse(R"({"metric":"0x3CD302",
        "error":"does not decode as KCellularLteTxPower: truncated varint at byte 1"})"));
    EXPECT_TRUE(lines[3]["metric"].is_null());
    EXPECT_EQ(lines[3]["error"], "the line is not a JSON object");
    EXPECT_EQ(lines[4], Json::parse(R"({"metric":"0x3C40C2","property":"myLTESCellInfoDict",
        "dict":{"timestamp":"2017-07-14 02:40:00 GMT","dl_bw":50,"ul_bw":3}})"));

    EXPECT_NE(run.err.find("Metric ID in Hex = 3CD302\n"), std::string::npos) << run.err;
    EXPECT_NE(run.err.find("I dont care for this Metric\n"), std::string::npos);
    EXPECT_NE(run.err.find("Received Valid Metric\n"), std::string::npos);
    EXPECT_EQ(run.out.find("Metric ID in Hex"), std::string::npos);
}

TEST(Pyxonctl, DecodeWithoutVerboseLeavesStderrToProblems) {
    const std::string input =
        "{\"kKeyMetricID\": 3986178, \"kKeyPayload\": \"08fbb0def7d32b12040814101e\"}\n";
    const ProgramRun quiet = pyxonctl("decode", input);
    const ProgramRun verbose = pyxonctl("-v decode", input);
    EXPECT_EQ(quiet.exitCode, 0);
    EXPECT_EQ(quiet.err, "");
    EXPECT_EQ(quiet.out, verbose.out);
    EXPECT_NE(verbose.err.find("Metric ID in Hex = 3CD302\n"), std::string::npos) << verbose.err;
}

TEST(Pyxonctl, HelpNamesTheVerboseOption) {
    const ProgramRun run = pyxonctl("--help", "");
    EXPECT_NE(run.out.find("-v,--verbose"), std::string::npos) << run.out;
}

TEST(Pyxonctl, DecodeOfEmptyInputWritesNothingAndSucceeds) {
    const ProgramRun run = pyxonctl("decode", "");
    EXPECT_EQ(run.exitCode, 0);
    EXPECT_TRUE(run.out.empty());
}

TEST(Pyxonctl, HelpExplainsDecodeWithAnExample) {
    const ProgramRun run = pyxonctl("--help", "");
    EXPECT_EQ(run.exitCode, 0);
    EXPECT_NE(run.out.find("decode"), std::string::npos);
    EXPECT_NE(run.out.find("kKeyMetricID"), std::string::npos);
    const ProgramRun decodeHelp = pyxonctl("decode --help", "");
    EXPECT_EQ(decodeHelp.exitCode, 0);
    EXPECT_NE(decodeHelp.out.find("pyxonctl decode"), std::string::npos);
    EXPECT_NE(decodeHelp.out.find("\"ignored\":true"), std::string::npos);
}

TEST(Pyxonctl, MissingSubcommandIsAnError) {
    const ProgramRun run = pyxonctl("", "");
    EXPECT_NE(run.exitCode, 0);
}

TEST(Pyxonctl, EveryUsageErrorExitsWithTwoAndNamesTheOption) {
    const ProgramRun badValue = pyxonctl("export drive.pyxrec --format xml", "");
    EXPECT_EQ(badValue.exitCode, 2);
    EXPECT_NE(badValue.err.find("--format"), std::string::npos) << badValue.err;
    const ProgramRun unknown = pyxonctl("decode --no-such-option", "");
    EXPECT_EQ(unknown.exitCode, 2);
    EXPECT_NE(unknown.err.find("--no-such-option"), std::string::npos) << unknown.err;
    EXPECT_EQ(pyxonctl("", "").exitCode, 2);
    EXPECT_EQ(pyxonctl("--version", "").exitCode, 0);
}

}  // namespace
