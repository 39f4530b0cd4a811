#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <csignal>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <thread>

#include "core/Log.h"
#include "recordings/RecordingReader.h"
#include "recordings/RecordingWriter.h"
#include "tests/recordings/SampleEvents.h"
#include "tests/recordings/TempDir.h"

namespace {

using pyx::recordings::RecordingReader;
using pyx::recordings::RecordingWriter;
using pyx::testing::readAll;
using pyx::testing::recordingOptions;
using pyx::testing::sampleEvent;
using pyx::testing::sequenceOf;
using pyx::testing::TempDir;

std::int64_t wallNow() {
    return std::chrono::duration_cast<std::chrono::nanoseconds>(
               std::chrono::system_clock::now().time_since_epoch())
        .count();
}

std::string contentsOf(const std::string& file) {
    std::ifstream in(file);
    std::stringstream text;
    text << in.rdbuf();
    return text.str();
}

std::vector<std::string> linesOf(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) lines.push_back(line);
    return lines;
}

TEST(RecordingFailure, AProcessKilledMidBurstLeavesAFileThatOpensWithEveryCommittedEvent) {
    const TempDir dir;
    const std::string file = dir.file("killed.pyxrec");
    const pid_t child = fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
        // The child records a steady burst (about 100,000 events a second) until it is killed.
        auto options = recordingOptions(file);
        options.queueCapacity = 1 << 22;
        RecordingWriter writer(options);
        for (std::int64_t n = 0;; ++n) {
            writer.add(velk::kEventMetric, sampleEvent(n));
            if (n % 100 == 99) std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(2500));
    const std::int64_t killedAt = wallNow();
    ASSERT_EQ(kill(child, SIGKILL), 0);
    int status = 0;
    ASSERT_EQ(waitpid(child, &status, 0), child);
    ASSERT_TRUE(WIFSIGNALED(status));

    const auto events = readAll(file);
    ASSERT_FALSE(events.empty());
    // Every event up to the last committed one, with none missing and none out of order.
    for (std::size_t i = 0; i < events.size(); ++i)
        ASSERT_EQ(sequenceOf(events[i].object), static_cast<std::int64_t>(i));
    // What is lost is at most the last second before the kill.
    EXPECT_GE(events.back().wallNs, killedAt - 1'000'000'000) << events.size() << " events";
    EXPECT_EQ(RecordingReader(file).summary().events, events.size());
}

TEST(RecordingFailure, AFileSizeLimitStopsTheRecordingWithOneLineAndTheFileStillOpens) {
    const TempDir dir;
    const std::string file = dir.file("full.pyxrec");
    const std::string err = dir.file("stderr.txt");
    const pid_t child = fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
        // A file-size limit stands in for a full disk: writes past it fail with EFBIG.
        std::signal(SIGXFSZ, SIG_IGN);
        const rlimit limit{256 * 1024, 256 * 1024};
        setrlimit(RLIMIT_FSIZE, &limit);
        std::FILE* out = std::fopen(err.c_str(), "w");
        if (out == nullptr) _exit(4);
        dup2(fileno(out), STDERR_FILENO);
        auto options = recordingOptions(file);
        options.commitInterval = std::chrono::milliseconds(20);
        RecordingWriter writer(options);
        const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(60);
        std::uint64_t added = 0;
        for (std::int64_t n = 0; !writer.counts().stopped; ++n) {
            if (std::chrono::steady_clock::now() > deadline) _exit(3);
            writer.add(velk::kEventMetric, sampleEvent(n, 200));
            ++added;
            if (n % 50 != 49) continue;
            // Each batch is committed before the next is added: a writer thread held back by a
            // loaded machine would otherwise take the whole limit in its first transaction,
            // which then fails with nothing committed.
            for (auto c = writer.counts(); !c.stopped && c.recorded + c.dropped < added;
                 c = writer.counts()) {
                if (std::chrono::steady_clock::now() > deadline) _exit(3);
                std::this_thread::sleep_for(std::chrono::milliseconds(1));
            }
        }
        // The recording has stopped; the program goes on and closes normally.
        writer.add(velk::kEventMetric, sampleEvent(0));
        ++added;
        writer.close();
        std::fflush(stderr);
        // Every event added is either in the file or counted as dropped.
        const auto counts = writer.counts();
        _exit(counts.recorded + counts.dropped == added ? 0 : 5);
    }
    int status = 0;
    ASSERT_EQ(waitpid(child, &status, 0), child);
    ASSERT_TRUE(WIFEXITED(status));
    ASSERT_EQ(WEXITSTATUS(status), 0);

    const auto lines = linesOf(contentsOf(err));
    ASSERT_EQ(lines.size(), 1u) << contentsOf(err);
    EXPECT_EQ(lines[0].rfind("recording " + file + " stopped: ", 0), 0u) << lines[0];
    EXPECT_NE(lines[0].find("the file reached the size limit"), std::string::npos) << lines[0];

    const auto events = readAll(file);
    EXPECT_GT(events.size(), 100u);
    for (std::size_t i = 0; i < events.size(); ++i)
        ASSERT_EQ(sequenceOf(events[i].object), static_cast<std::int64_t>(i));
}

TEST(RecordingFailure, ARemovedFileStopsTheRecordingWithOneLine) {
    const pyx::CapturedLines log(pyx::systemLogSink());
    const TempDir dir;
    const std::string file = dir.file("vanishing.pyxrec");
    RecordingWriter writer(recordingOptions(file));
    for (std::int64_t n = 0; n < 10; ++n) writer.add(velk::kEventMetric, sampleEvent(n));
    writer.flush();
    std::filesystem::remove(file);
    std::filesystem::remove(file + "-wal");
    std::filesystem::remove(file + "-shm");
    for (std::int64_t n = 10; n < 20; ++n) writer.add(velk::kEventMetric, sampleEvent(n));
    writer.flush();
    EXPECT_TRUE(writer.counts().stopped);
    writer.add(velk::kEventMetric, sampleEvent(20));
    writer.close();
    // The ten committed to the removed file are lost with it, and the one after the stop.
    EXPECT_EQ(writer.counts().recorded, 10u);
    EXPECT_EQ(writer.counts().dropped, 11u);
    const auto lines = log.lines();
    ASSERT_EQ(lines.size(), 1u);
    EXPECT_EQ(lines[0], "recording " + file +
                            " stopped: the file was removed or replaced (10 events recorded); "
                            "the program goes on");
}

TEST(RecordingFailure, AFolderThatCannotBeWrittenStopsTheRecordingWithOneLine) {
    const TempDir dir;
    std::filesystem::permissions(
        dir.path(), std::filesystem::perms::owner_read | std::filesystem::perms::owner_exec |
                        std::filesystem::perms::others_read | std::filesystem::perms::others_exec);
    const std::string file = dir.file("nowhere.pyxrec");
    int pipeEnds[2];
    ASSERT_EQ(pipe(pipeEnds), 0);
    const pid_t child = fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
        // Root writes into read-only folders: the child gives up root first.
        if (geteuid() == 0 && (setgid(65534) != 0 || setuid(65534) != 0)) _exit(4);
        dup2(pipeEnds[1], STDERR_FILENO);
        close(pipeEnds[0]);
        RecordingWriter writer(recordingOptions(file));
        writer.add(velk::kEventMetric, sampleEvent(0));
        writer.flush();
        const bool stopped = writer.counts().stopped;
        writer.close();
        std::fflush(stderr);
        _exit(stopped ? 0 : 3);
    }
    close(pipeEnds[1]);
    std::string output;
    char buffer[512];
    for (ssize_t n; (n = read(pipeEnds[0], buffer, sizeof buffer)) > 0;)
        output.append(buffer, static_cast<std::size_t>(n));
    close(pipeEnds[0]);
    int status = 0;
    ASSERT_EQ(waitpid(child, &status, 0), child);
    ASSERT_TRUE(WIFEXITED(status));
    ASSERT_EQ(WEXITSTATUS(status), 0) << output;
    const auto lines = linesOf(output);
    ASSERT_EQ(lines.size(), 1u) << output;
    EXPECT_EQ(lines[0], "recording " + file +
                            " stopped: cannot open it: the file or its folder cannot be written "
                            "(0 events recorded); the program goes on");
}

}  // namespace
