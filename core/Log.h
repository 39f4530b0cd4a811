// The two line sinks of the system.
//
// systemLog(): the client's diagnostic lines (stderr on Linux).
// standardOutput(): the store's and start-up's plain lines (stdout).
//
// Each call writes one whole line, even when several threads write at once. A sink can be
// pointed elsewhere: pyxonctl sends the standard-output lines to stderr so that its own stdout
// carries only JSON, and tests capture either sink.
//
// A sink can be muted: pyxonctl mutes both unless --verbose, since a command line keeps stderr
// for problems. Writers of the per-event lines ask on() first and build no line when it is
// off, so a muted line costs nothing. systemFault() is for the lines that say something went
// wrong (a recording that stopped, a modem that went away): it is written even when the system
// log is muted.
#pragma once

#include <atomic>
#include <cstdio>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace pyx {

class LineSink {
  public:
    using Writer = std::function<void(std::string_view line)>;

    explicit LineSink(std::FILE* file) : file_(file) {}
    LineSink(const LineSink&) = delete;
    LineSink& operator=(const LineSink&) = delete;

    // Writes text followed by a newline, atomically with respect to other writers; nothing
    // while muted.
    void write(std::string_view text);
    // As write(), muted or not.
    void writeAlways(std::string_view text);
    // Whether write() writes: callers skip building a line nobody will read.
    [[nodiscard]] bool on() const { return !muted_.load(std::memory_order_relaxed); }
    void mute(bool muted) { muted_.store(muted, std::memory_order_relaxed); }
    // Sends further lines to file instead (stderr, say).
    void redirect(std::FILE* file);
    // Sends further lines to writer (called under the sink's lock, line without newline);
    // an empty writer restores the file.
    void intercept(Writer writer);

  private:
    std::FILE* file_;
    Writer writer_;
    std::atomic<bool> muted_{false};
};

// The process's two sinks (shared instances, created on first use).
LineSink& systemLogSink();
LineSink& standardOutputSink();

inline void systemLog(std::string_view line) {
    systemLogSink().write(line);
}
// A line about a fault, written to the system log even when it is muted.
inline void systemFault(std::string_view line) {
    systemLogSink().writeAlways(line);
}
inline void standardOutput(std::string_view line) {
    standardOutputSink().write(line);
}

// Collects what a sink writes for the lifetime of the object (tests, tools).
class CapturedLines {
  public:
    explicit CapturedLines(LineSink& sink);
    ~CapturedLines();
    CapturedLines(const CapturedLines&) = delete;
    CapturedLines& operator=(const CapturedLines&) = delete;

    [[nodiscard]] std::vector<std::string> lines() const;
    [[nodiscard]] bool contains(std::string_view line) const;
    void clear();

  private:
    LineSink& sink_;
    struct State;
    std::shared_ptr<State> state_;
};

}  // namespace pyx
