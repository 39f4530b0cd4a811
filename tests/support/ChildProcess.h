// A program the tests start and always end: it is sent SIGTERM (then SIGKILL) when the object
// goes, and dies with the test process if that one is killed first. It reads /dev/null. It
// leads a process group of its own, and what it started is killed with it.
#pragma once

#include <sys/types.h>

#include <chrono>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace pyx::test {

class ChildProcess {
  public:
    struct Options {
        std::vector<std::string> argv{};           // argv[0] is looked up on the PATH
        std::map<std::string, std::string> env{};  // added to (or replacing) this environment
        bool captureStdout = false;                // readable with readLine() or takeStdout()
        std::string stderrFile{};                  // empty: the test's stderr
        std::string stdoutFile{};                  // when not captured; empty: /dev/null
        bool captureStderr = false;                // readable with takeStderr(); else stderrFile
        std::string workDir{};                     // empty: the test's working directory
    };

    explicit ChildProcess(Options options);
    ~ChildProcess();
    ChildProcess(const ChildProcess&) = delete;
    ChildProcess& operator=(const ChildProcess&) = delete;

    // One line of the child's standard output, without its newline, or nothing when none came
    // within timeout.
    [[nodiscard]] std::optional<std::string> readLine(std::chrono::milliseconds timeout);
    // The reading end of the captured stdout (or stderr) pipe, which the caller now owns and
    // closes; -1 when not captured or already taken.
    [[nodiscard]] int takeStdout();
    [[nodiscard]] int takeStderr();

    // Sends SIGTERM and waits for the exit status (SIGKILL after timeout): the exit code, or
    // 128 + the signal that ended it.
    int terminate(std::chrono::milliseconds timeout = std::chrono::seconds(10));
    // Waits for the child to end by itself (terminate() after timeout); its exit status.
    int wait(std::chrono::milliseconds timeout);
    [[nodiscard]] bool running();
    [[nodiscard]] pid_t pid() const { return pid_; }

  private:
    pid_t pid_ = -1;
    int stdout_ = -1;
    int stderr_ = -1;
    std::string buffered_;
    std::optional<int> status_;
};

}  // namespace pyx::test
