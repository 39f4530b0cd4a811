// A pyxonctl subcommand run in process, as the tests read it: its exit status, stdout and
// stderr.
#pragma once

#include <sstream>
#include <string>

#include "tools/ExportCommand.h"
#include "tools/InfoCommand.h"

namespace pyx::test {

struct Outcome {
    int status = -1;
    std::string out;
    std::string err;
};

// run(out, err) returns the exit status.
template <typename Run>
Outcome inProcess(const Run& run) {
    std::ostringstream out, err;
    Outcome outcome;
    outcome.status = run(out, err);
    outcome.out = out.str();
    outcome.err = err.str();
    return outcome;
}

inline Outcome info(const std::string& file) {
    return inProcess([&](std::ostream& out, std::ostream& err) { return runInfo(file, out, err); });
}

inline Outcome exportOf(const ExportRequest& request) {
    return inProcess(
        [&](std::ostream& out, std::ostream& err) { return runExport(request, out, err); });
}

}  // namespace pyx::test
