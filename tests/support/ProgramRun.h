// Runs a program to its end, as a user's shell would: input on stdin, stdout and stderr
// collected apart.
#pragma once

#include <string>
#include <vector>

namespace pyx::test {

struct ProgramRun {
    int exitCode = -1;  // -1 when it could not start or ended by a signal
    std::string out;
    std::string err;

    // Runs args[0] (a path, or a name looked up in PATH) with the arguments that follow, and
    // waits for its end.
    static ProgramRun of(const std::vector<std::string>& args, const std::string& input = {});
    // Runs a shell command line (pipes, redirections, quoting) the same way.
    static ProgramRun shell(const std::string& commandLine, const std::string& input = {});
};

}  // namespace pyx::test
