// The source a program runs on: the factory's transport for --source, held back while the
// client's queues are full, and wrapped in a recording for --record. pyxon and pyxonctl listen
// open their source the same way through here.
#pragma once

#include <memory>
#include <optional>
#include <string>

#include "sources/Source.h"

namespace pyx {

struct ProgramSource {
    std::shared_ptr<velk::client::Transport> transport;
    // The recording's writer, for --record; the program closes it before it ends.
    std::shared_ptr<recordings::RecordingWriter> recording;
};

// options.backlog is set to what waits on the client's serial queue and the main queue, so
// that a replay hands out no more than the store takes in. record: the recording's file, with
// append for --append. Throws sources::SourceError with one line saying what is wrong.
[[nodiscard]] ProgramSource openProgramSource(sources::SourceOptions options,
                                              const std::optional<std::string>& record, bool append,
                                              const std::string& programVersion);

}  // namespace pyx
