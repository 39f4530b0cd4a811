// The source a program runs on: the factory's transport for --source, wrapped in a recording
// for --record, and installed as the client's transport. pyxon and pyxonctl listen open their
// source the same way through here, and end it the same way: the source's events stop first
// (its thread posts to queues that static destruction takes down), then the recording closes
// and says what it holds.
#pragma once

#include <memory>
#include <optional>
#include <string>

#include "sources/Source.h"

namespace pyx {

class ProgramSource {
  public:
    ProgramSource(ProgramSource&& other) noexcept = default;
    ProgramSource& operator=(ProgramSource&&) = delete;
    ProgramSource(const ProgramSource&) = delete;
    ProgramSource& operator=(const ProgramSource&) = delete;
    // As close(): an early exit (an exception) ends the source too.
    ~ProgramSource();

    // Stops the source's events, then writes what is still queued for the recording and closes
    // it. Safe to call more than once.
    void close();

    [[nodiscard]] const std::shared_ptr<velk::client::Transport>& transport() const {
        return transport_;
    }

  private:
    friend ProgramSource openProgramSource(sources::SourceOptions options,
                                           const std::optional<std::string>& record, bool append,
                                           const std::string& programVersion);
    ProgramSource(std::shared_ptr<velk::client::Transport> transport,
                  std::shared_ptr<recordings::RecordingWriter> recording);

    std::shared_ptr<velk::client::Transport> transport_;
    std::shared_ptr<recordings::RecordingWriter> recording_;  // for --record
};

// Opens the source and sets it as velk's transport factory. record: the recording's file, with
// append for --append. Throws sources::SourceError with one line saying what is wrong.
[[nodiscard]] ProgramSource openProgramSource(sources::SourceOptions options,
                                              const std::optional<std::string>& record, bool append,
                                              const std::string& programVersion);

}  // namespace pyx
