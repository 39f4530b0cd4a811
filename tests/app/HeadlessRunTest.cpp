// Runs the pyxon program as a new user would, headless on the simulated baseband, and checks
// what it prints and how it ends.
#include <gtest/gtest.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <mutex>
#include <set>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "tests/support/ChildProcess.h"

namespace {

using pyx::test::ChildProcess;

// The program with both its stdout and its stderr on pipes of their own.
ChildProcess spawn(std::vector<std::string> args) {
    return ChildProcess(ChildProcess::Options{
        .argv = std::move(args), .captureStdout = true, .captureStderr = true});
}

// Reads everything the child writes on one descriptor, in a thread, line by line.
class LineCollector {
  public:
    explicit LineCollector(int fd) : thread_([this, fd] { read(fd); }) {}
    ~LineCollector() {
        if (thread_.joinable()) thread_.join();
    }
    LineCollector(const LineCollector&) = delete;
    LineCollector& operator=(const LineCollector&) = delete;

    // What has been read so far (the child may still be writing).
    std::vector<std::string> lines() {
        const std::lock_guard lock(mutex_);
        return lines_;
    }
    // Everything the child wrote: waits until its end of the pipe is closed.
    std::vector<std::string> all() {
        if (thread_.joinable()) thread_.join();
        return lines_;
    }

  private:
    void read(int fd) {
        std::FILE* f = fdopen(fd, "r");
        char* line = nullptr;
        std::size_t cap = 0;
        ssize_t n;
        while ((n = getline(&line, &cap, f)) > 0) {
            std::string s(line, static_cast<std::size_t>(n));
            if (!s.empty() && s.back() == '\n') s.pop_back();
            const std::lock_guard lock(mutex_);
            lines_.push_back(std::move(s));
        }
        free(line);  // NOLINT: getline's buffer
        std::fclose(f);
    }
    std::mutex mutex_;
    std::vector<std::string> lines_;
    std::thread thread_;
};

const std::vector<std::string> kArrivalPrefixes = {
    "Current CDRX Config is ",
    "Current RRC state is ",
    "Current Serving Cell Info is ",
    "Received LTE Cell Resel Info is ",
    "Received LTE Tx Power is ",
    "Received RSRP RSRQ SINR is : ",
    "Received Component Carrier info is ",
    "Received CA Status Dict is ",
    "Received LTE InterRat Meas Info is ",
    "Received LTE IRAT Meas is ",
    "Received Secondary Cell Measurement Dict is ",
    "Received MM Common Info Dict is : ",
    "Received Bearer Context Info is ",
    "Received EMM Context is ",
    "Received MM Context Info is ",
    "Received GMM Context Info is ",
    "Received UMTS RRC Connection State is ",
    "Received UMTS RRC Configuration is ",
    "Received UMTS Serving Cell Info is ",
    "Received UMTS Serving Cell Meas is ",
    "Received Tx Power is ",
    "Received UMTS Cell Resel Info is ",
    "Received UMTS InterRat Meas Info is ",
    "Received GSM Serving Cell Info ",
    "Received GSM Idle Config Info is ",
    "Received GSM Idle Serving Cell Meas Info is ",
    "Received GSM Connected Serving Cell Meas Info is ",
    "Received GSM Nbr Cell Meas Info is ",
    "Received GSM GPRS Config Info is ",
    "Received SIM Card File Info is ",
};

bool startsWith(const std::string& s, const std::string& prefix) {
    return s.compare(0, prefix.size(), prefix) == 0;
}

// What a new user's run must show; returns what is still missing.
std::vector<std::string> missingLines(const std::vector<std::string>& lines) {
    std::vector<std::string> missing;
    const auto has = [&](const std::string& exact) {
        for (const auto& l : lines)
            if (l == exact) return true;
        return false;
    };
    const auto hasPrefix = [&](const std::string& prefix) {
        for (const auto& l : lines)
            if (startsWith(l, prefix)) return true;
        return false;
    };
    for (const char* exact :
         {"pushing metric file", "Querying SIM files", "Metric ID in Hex = 3C0013",
          "Received Valid Metric", "I dont care for this Metric", "I dont care for events"})
        if (!has(exact)) missing.emplace_back(exact);
    for (const auto& prefix : kArrivalPrefixes)
        if (!hasPrefix(prefix)) missing.push_back(prefix + "...");
    return missing;
}

// What pyxon prints on each of its streams and how it ends, for a run that ends by itself.
struct Ended {
    int status = -1;
    std::vector<std::string> out;
    std::vector<std::string> err;
};
Ended runToItsEnd(std::vector<std::string> args) {
    ChildProcess child = spawn(std::move(args));
    Ended ended;
    if (child.pid() <= 0) return ended;
    LineCollector o(child.takeStdout());
    LineCollector e(child.takeStderr());
    ended.status = child.wait(std::chrono::seconds(60));
    ended.out = o.all();
    ended.err = e.all();
    return ended;
}

TEST(PyxonOptions, QmdlWithoutALiveDiagSourceIsOneLineWithStatusTwo) {
    const Ended ended = runToItsEnd({PYXON_BINARY, "--headless", "--qmdl", "drive.qmdl"});
    EXPECT_EQ(ended.status, 2);
    EXPECT_EQ(ended.err, std::vector<std::string>{
                             "pyxon: --qmdl drive.qmdl: only with a live diag source (--source "
                             "diag or diag:PORT), not with --source sim"});
}

TEST(PyxonOptions, HelpNamesTheDiagSourceAndQmdlWithExamples) {
    const Ended ended = runToItsEnd({PYXON_BINARY, "--help"});
    EXPECT_EQ(ended.status, 0);
    std::string out;
    for (const std::string& line : ended.out) out += line + "\n";
    for (const char* text :
         {"--qmdl FILE", "  diag:PORT      ", "  diag:FILE      ",
          "pyxon --source diag --qmdl drive.qmdl", "pyxon --source diag:drive.qmdl --speed 4"})
        EXPECT_NE(out.find(text), std::string::npos) << text;
}

}  // namespace

TEST(PyxonHeadless, ShowsEveryKindOnTheSimulatedBasebandAndExitsCleanlyOnSigterm) {
    ChildProcess child = spawn({PYXON_BINARY, "--headless", "--speed", "20"});
    ASSERT_GT(child.pid(), 0);
    std::vector<std::string> out;
    {
        LineCollector stdoutLines(child.takeStdout());
        LineCollector stderrLines(child.takeStderr());
        // Wait, bounded, until everything has shown up (not a timing assertion: a slow machine
        // only takes longer).
        for (int i = 0; i < 1200 && child.running() && !missingLines(stdoutLines.lines()).empty();
             ++i)
            std::this_thread::sleep_for(std::chrono::milliseconds(100));
        // SIGTERM; SIGKILL if it has not ended 10 s later.
        const int status = child.terminate();
        ASSERT_LT(status, 128) << "ended by signal " << status - 128;
        EXPECT_EQ(status, 0);
        out = stdoutLines.all();
        for (const auto& line : stderrLines.all())
            EXPECT_EQ(line.find("rejected"), std::string::npos) << line;
    }
    const auto missing = missingLines(out);
    for (const auto& m : missing) ADD_FAILURE() << "never printed: " << m;
}

TEST(PyxonOptions, UnknownOptionIsAUsageErrorWithStatusTwo) {
    ChildProcess child = spawn({PYXON_BINARY, "--no-such-option"});
    ASSERT_GT(child.pid(), 0);
    std::vector<std::string> err;
    {
        LineCollector o(child.takeStdout());
        LineCollector e(child.takeStderr());
        const int status = child.wait(std::chrono::seconds(60));
        ASSERT_LT(status, 128) << "ended by signal " << status - 128;
        EXPECT_EQ(status, 2);
        err = e.all();
    }
    ASSERT_FALSE(err.empty());
    EXPECT_NE(err.front().find("no-such-option"), std::string::npos) << err.front();
}

TEST(PyxonOptions, VersionAndHelpExitZero) {
    for (const char* option : {"--version", "--help"}) {
        ChildProcess child = spawn({PYXON_BINARY, option});
        ASSERT_GT(child.pid(), 0);
        std::vector<std::string> out;
        {
            LineCollector o(child.takeStdout());
            LineCollector e(child.takeStderr());
            const int status = child.wait(std::chrono::seconds(60));
            ASSERT_LT(status, 128) << "ended by signal " << status - 128;
            EXPECT_EQ(status, 0) << option;
            out = o.all();
        }
        ASSERT_FALSE(out.empty()) << option;
    }
}
