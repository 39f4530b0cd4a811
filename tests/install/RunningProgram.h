// A program left running in the background, its stdout written to a file that the test reads
// while it runs; ended with SIGTERM, or killed when the test gives up on it.
#pragma once

#include <sys/types.h>

#include <chrono>
#include <filesystem>
#include <string>
#include <vector>

namespace pyx::test {

class RunningProgram {
  public:
    // Starts args[0] (a path) with the arguments that follow, in folder workDir.
    RunningProgram(const std::vector<std::string>& args, const std::filesystem::path& workDir);
    ~RunningProgram();
    RunningProgram(const RunningProgram&) = delete;
    RunningProgram& operator=(const RunningProgram&) = delete;

    [[nodiscard]] bool started() const { return pid_ > 0; }
    // What it has written to stdout so far.
    [[nodiscard]] std::string output() const;
    // Waits, bounded by limit, until every one of lines is a whole line of its output; true if
    // they all came. Not a timing assertion: a slow machine only takes longer.
    bool waitForLines(const std::vector<std::string>& lines, std::chrono::seconds limit) const;
    // Sends SIGTERM and waits for the end: the exit code, or -1 when a signal ended it.
    int terminate();

  private:
    std::filesystem::path outPath_;
    pid_t pid_ = -1;
};

}  // namespace pyx::test
