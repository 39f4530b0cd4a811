// The two line sinks of the system.
//
// systemLog(): the client's diagnostic lines (stderr on Linux).
// standardOutput(): the store's and start-up's plain lines (stdout).
//
// Each call writes one whole line, even when several threads write at once. A sink can be
// pointed elsewhere: pyxonctl sends the standard-output lines to stderr so that its own stdout
// carries only JSON, and tests capture either sink.
#pragma once

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

    // Writes text followed by a newline, atomically with respect to other writers.
    void write(std::string_view text);
    // Sends further lines to file instead (stderr, say).
    void redirect(std::FILE* file);
    // Sends further lines to writer (called under the sink's lock, line without newline);
    // an empty writer restores the file.
    void intercept(Writer writer);

  private:
    std::FILE* file_;
    Writer writer_;
};

// The process's two sinks (shared instances, created on first use).
LineSink& systemLogSink();
LineSink& standardOutputSink();

inline void systemLog(std::string_view line) {
    systemLogSink().write(line);
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
