// What a recording says about one run that wrote to it: where the events came from, which
// program wrote them, and where and when.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace pyx::recordings {

struct RecordingSession {
    std::int64_t id = 0;
    std::int64_t startNs = 0;  // wall clock, ns since 1970
    std::string programVersion;
    std::string source;  // the --source text, e.g. "sim" or "modem:0"
    std::optional<std::int64_t> seed;
    std::optional<double> speed;
    std::string host;
};

}  // namespace pyx::recordings
