// pyxon itself with --record and with a replay source, run as a user would.
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <fcntl.h>
#include <algorithm>
#include <chrono>
#include <csignal>
#include <fstream>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "recordings/RecordingReader.h"
#include "tests/recordings/TempDir.h"

namespace {

using pyx::testing::TempDir;

// Starts pyxon with args, its stdout to /dev/null and its stderr to errFile.
pid_t startPyxon(const std::vector<std::string>& args, const std::string& errFile) {
    const pid_t pid = fork();
    if (pid == 0) {
        const int null = open("/dev/null", O_WRONLY);
        const int err = open(errFile.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0644);
        dup2(null, STDOUT_FILENO);
        dup2(err, STDERR_FILENO);
        std::vector<std::string> all{PYXON_BINARY};
        all.insert(all.end(), args.begin(), args.end());
        std::vector<char*> argv;
        for (auto& a : all) argv.push_back(a.data());
        argv.push_back(nullptr);
        execv(argv[0], argv.data());
        _exit(127);
    }
    return pid;
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

int stop(pid_t pid) {
    kill(pid, SIGTERM);
    int status = 0;
    waitpid(pid, &status, 0);
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

TEST(ViewerRecording, PyxonRecordsEveryEventAndSaysHowManyWhenItStops) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    const std::string err = dir.file("err.txt");
    const pid_t pyxon = startPyxon({"--headless", "--speed", "50", "--record", file}, err);
    ASSERT_TRUE(waitForLine(err, "MetricsTrigger dict="));
    std::this_thread::sleep_for(std::chrono::milliseconds(500));
    EXPECT_EQ(stop(pyxon), 0);

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
    const pid_t again = startPyxon({"--headless", "--record", file}, err);
    int status = 0;
    waitpid(again, &status, 0);
    EXPECT_EQ(WEXITSTATUS(status), 2);
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
    const pid_t recorder = startPyxon({"--headless", "--speed", "50", "--record", file}, err);
    ASSERT_TRUE(waitForLine(err, "MetricsTrigger dict="));
    std::this_thread::sleep_for(std::chrono::milliseconds(300));
    EXPECT_EQ(stop(recorder), 0);
    const auto events = pyx::recordings::RecordingReader(file).summary().events;

    const pid_t viewer =
        startPyxon({"--headless", "--source", "replay:" + file, "--speed", "0"}, err);
    const std::string end = "replay " + file + ": end of the recording after " +
                            std::to_string(events) + " events; the screens keep the last values";
    ASSERT_TRUE(waitForLine(err, end));
    std::this_thread::sleep_for(std::chrono::milliseconds(200));
    // Still running: the viewer goes on after the end, until it is stopped.
    EXPECT_EQ(waitpid(viewer, nullptr, WNOHANG), 0);
    EXPECT_EQ(stop(viewer), 0);
    const auto lines = linesOf(err);
    EXPECT_EQ(std::count(lines.begin(), lines.end(), end), 1);
}

}  // namespace
