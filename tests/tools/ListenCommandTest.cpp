// pyxonctl listen run as a program against the simulated baseband: its lines are records that
// decode and screen read, it stops at a count, a duration or a signal, and always exits 0.
#include <gtest/gtest.h>

#include <fcntl.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <fstream>
#include <iterator>
#include <nlohmann/json.hpp>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "tests/support/ProgramRun.h"
#include "tests/tools/PyxonctlShell.h"
#include "tools/RecordReader.h"

namespace {

using Json = nlohmann::ordered_json;
using pyx::test::ProgramRun;

ProgramRun shell(const std::string& commandLine) {
    return pyx::test::pyxonctlShell(commandLine);
}

std::vector<std::string> lines(const std::string& text) {
    return pyx::test::linesOf(text);
}

TEST(ListenCommand, PrintsTheAskedCountOfMetricRecordsThatReadBackAsRecords) {
    const ProgramRun run = shell("\"$PYXONCTL\" listen --speed 50 --count 12");
    EXPECT_EQ(run.exitCode, 0);
    const auto printed = lines(run.out);
    ASSERT_EQ(printed.size(), 12U) << run.out;
    for (const auto& line : printed) {
        const pyx::MetricRecord record = pyx::readRecord(line);
        ASSERT_NE(record.find("kKeyMetricID"), nullptr) << line;
        ASSERT_NE(record.find("kKeyPayload"), nullptr) << line;
        EXPECT_TRUE(record.find("kKeyPayload")->isBytes()) << line;
        // Trigger events are not printed: every line is a metric event.
        EXPECT_EQ(record.find("kKeyTriggerID"), nullptr) << line;
    }
    EXPECT_EQ(Json::parse(printed.front()).begin().key(), "kKeyMetricID");
}

TEST(ListenCommand, LeavesStderrEmptyUnlessVerbose) {
    const ProgramRun quiet = shell("\"$PYXONCTL\" listen --speed 50 --count 200");
    EXPECT_EQ(quiet.exitCode, 0);
    EXPECT_EQ(lines(quiet.out).size(), 200U);
    EXPECT_EQ(quiet.err, "");

    const ProgramRun verbose = shell("\"$PYXONCTL\" listen --speed 50 --count 20 --verbose");
    EXPECT_EQ(verbose.exitCode, 0);
    EXPECT_EQ(lines(verbose.out).size(), 20U);
    EXPECT_NE(verbose.err.find("pushing metric file\n"), std::string::npos) << verbose.err;
    EXPECT_NE(verbose.err.find(": MetricsTrigger dict="), std::string::npos) << verbose.err;
}

TEST(ListenCommand, AnswerToTheStartUpSimQueryIsAmongTheFirstRecords) {
    const ProgramRun run = shell("\"$PYXONCTL\" listen --speed 50 --count 40");
    EXPECT_EQ(run.exitCode, 0);
    int simFiles = 0;
    for (const auto& line : lines(run.out))
        simFiles += Json::parse(line)["kKeyMetricID"] == 0x3C0013;
    EXPECT_GE(simFiles, 1) << run.out;
}

TEST(ListenCommand, PipesIntoScreenWhichShowsTheServingCell) {
    const ProgramRun run = shell(
        "\"$PYXONCTL\" listen --speed 100 --count 200 | \"$PYXONCTL\" screen LTE \"Serving Cell "
        "Meas\"");
    EXPECT_EQ(run.exitCode, 0);
    const Json screen = Json::parse(run.out);
    EXPECT_EQ(screen["key"], "LTE Serving Cell Meas");
    std::vector<std::string> texts;
    for (const auto& row : screen["sections"][0]["rows"]) texts.push_back(row["text"]);
    EXPECT_NE(std::find(texts.begin(), texts.end(), "rsrp0"), texts.end()) << run.out;
    EXPECT_NE(std::find(texts.begin(), texts.end(), "phy_cell_id"), texts.end()) << run.out;
}

TEST(ListenCommand, StopsAfterItsDurationWithZero) {
    const ProgramRun run = shell("\"$PYXONCTL\" listen --duration 0.5 > /dev/null; echo $?");
    EXPECT_EQ(run.out, "0\n");
}

TEST(ListenCommand, ReaderThatGoesAwayEndsTheRunWithZero) {
    const ProgramRun run = shell(
        "{ { \"$PYXONCTL\" listen --speed 50; echo $? >&3; } | head -n 2 > /dev/null; } 3>&1");
    EXPECT_EQ(run.out, "0\n");
}

TEST(ListenCommand, SigtermAndSigintEndTheRunWithZero) {
    for (const int signal : {SIGTERM, SIGINT}) {
        const pid_t child = ::fork();
        ASSERT_GE(child, 0);
        if (child == 0) {
            const int devnull = ::open("/dev/null", O_WRONLY);
            ::dup2(devnull, 1);
            ::dup2(devnull, 2);
            ::execl(PYXONCTL_PATH, PYXONCTL_PATH, "listen", static_cast<char*>(nullptr));
            ::_exit(127);
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(500));
        ::kill(child, signal);
        int status = 0;
        ASSERT_EQ(::waitpid(child, &status, 0), child);
        ASSERT_TRUE(WIFEXITED(status)) << "signal " << signal;
        EXPECT_EQ(WEXITSTATUS(status), 0) << "signal " << signal;
    }
}

TEST(ListenCommand, UnknownSourceIsAUsageErrorNamingTheForms) {
    const ProgramRun run = shell("\"$PYXONCTL\" listen --source bogus 2>&1; echo \"exit $?\"");
    EXPECT_NE(run.out.find("--source 'bogus': expected sim, modem, modem:N"), std::string::npos)
        << run.out;
    EXPECT_NE(run.out.find("exit 2"), std::string::npos) << run.out;
}

TEST(ListenCommand, HelpExplainsTheSourcesWithExamples) {
    const ProgramRun run = shell("\"$PYXONCTL\" listen --help");
    EXPECT_EQ(run.exitCode, 0);
    for (const char* text : {"--source", "--duration", "--count", "modem:N", "replay:FILE",
                             "pyxonctl listen --source modem --duration 10 | pyxonctl screen"})
        EXPECT_NE(run.out.find(text), std::string::npos) << text;
}

}  // namespace
