// pyxon itself with --record and with a replay source, run as a user would.
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <fstream>
#include <map>
#include <memory>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "recordings/RecordingReader.h"
#include "tests/recordings/TempDir.h"
#include "tests/support/ChildProcess.h"

namespace {

using pyx::test::ChildProcess;
using pyx::testing::TempDir;

// pyxon with args, its stdout to /dev/null and its stderr to errFile; env is added to its
// environment.
std::unique_ptr<ChildProcess> startPyxon(const std::vector<std::string>& args,
                                         const std::string& errFile,
                                         std::map<std::string, std::string> env = {}) {
    std::vector<std::string> argv{PYXON_BINARY};
    argv.insert(argv.end(), args.begin(), args.end());
    return std::make_unique<ChildProcess>(ChildProcess::Options{
        .argv = std::move(argv), .env = std::move(env), .stderrFile = errFile});
}

std::vector<std::string> linesOf(const std::string& file) {
    std::ifstream in(file);
    std::vector<std::string> lines;
    for (std::string line; std::getline(in, line);) lines.push_back(line);
    return lines;
}

// Waits (a minute at most) until file has a line that contains text.
bool waitForLine(const std::string& file, const std::string& text) {
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(60);
    while (std::chrono::steady_clock::now() < deadline) {
        for (const auto& line : linesOf(file))
            if (line.find(text) != std::string::npos) return true;
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
    }
    return false;
}

TEST(ViewerRecording, PyxonRecordsEveryEventAndSaysHowManyWhenItStops) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    const std::string err = dir.file("err.txt");
    const auto pyxon = startPyxon({"--headless", "--speed", "50", "--record", file}, err);
    ASSERT_TRUE(waitForLine(err, "MetricsTrigger dict="));
    std::this_thread::sleep_for(std::chrono::milliseconds(500));
    EXPECT_EQ(pyxon->terminate(), 0);

    const auto summary = pyx::recordings::RecordingReader(file).summary();
    EXPECT_GT(summary.events, 0u);
    ASSERT_EQ(summary.sessions.size(), 1u);
    EXPECT_EQ(summary.sessions[0].source, "sim");
    EXPECT_EQ(summary.sessions[0].seed, 1);
    EXPECT_EQ(summary.sessions[0].speed, 50.0);
    const auto lines = linesOf(err);
    ASSERT_FALSE(lines.empty());
    EXPECT_EQ(lines.back(), "recording " + file + ": " + std::to_string(summary.events) +
                                " events recorded, 0 dropped");

    // A second run may not overwrite it, and says so.
    const auto again = startPyxon({"--headless", "--record", file}, err);
    EXPECT_EQ(again->wait(std::chrono::seconds(60)), 2);
    EXPECT_EQ(
        linesOf(err),
        (std::vector<std::string>{"pyxon: --record " + file +
                                  ": exists already; give --append to add a session to it, or "
                                  "choose another name"}));
}

TEST(ViewerRecording, APyxonReplaySaysOnceThatTheRecordingEndedAndGoesOnShowingIt) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    const std::string err = dir.file("err.txt");
    const auto recorder = startPyxon({"--headless", "--speed", "50", "--record", file}, err);
    ASSERT_TRUE(waitForLine(err, "MetricsTrigger dict="));
    std::this_thread::sleep_for(std::chrono::milliseconds(300));
    EXPECT_EQ(recorder->terminate(), 0);
    const auto events = pyx::recordings::RecordingReader(file).summary().events;

    const auto viewer =
        startPyxon({"--headless", "--source", "replay:" + file, "--speed", "0"}, err);
    const std::string end = "replay " + file + ": end of the recording after " +
                            std::to_string(events) + " events; the screens keep the last values";
    ASSERT_TRUE(waitForLine(err, end));
    std::this_thread::sleep_for(std::chrono::milliseconds(200));
    // Still running: the viewer goes on after the end, until it is stopped.
    EXPECT_TRUE(viewer->running());
    EXPECT_EQ(viewer->terminate(), 0);
    const auto lines = linesOf(err);
    EXPECT_EQ(std::count(lines.begin(), lines.end(), end), 1);
}

TEST(ViewerRecording, TheWindowClosesItsRecordingOnSigtermToo) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    const std::string err = dir.file("err.txt");
    const auto pyxon =
        startPyxon({"--speed", "50", "--record", file}, err, {{"QT_QPA_PLATFORM", "offscreen"}});
    ASSERT_TRUE(waitForLine(err, "MetricsTrigger dict="));
    std::this_thread::sleep_for(std::chrono::milliseconds(500));
    EXPECT_EQ(pyxon->terminate(), 0);

    const auto summary = pyx::recordings::RecordingReader(file).summary();
    EXPECT_GT(summary.events, 0u);
    const auto lines = linesOf(err);
    ASSERT_FALSE(lines.empty());
    EXPECT_EQ(lines.back(), "recording " + file + ": " + std::to_string(summary.events) +
                                " events recorded, 0 dropped");
}

}  // namespace
