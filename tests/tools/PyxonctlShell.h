// pyxonctl run as a user runs it, in a shell command line where it is $PYXONCTL, for the
// tools tests (PYXONCTL_PATH is the built program).
#pragma once

#include <sstream>
#include <string>
#include <vector>

#include "tests/support/ProgramRun.h"

namespace pyx::test {

// Runs commandLine in a shell and collects its output and exit code.
inline ProgramRun pyxonctlShell(const std::string& commandLine) {
    return ProgramRun::shell(std::string("PYXONCTL='") + PYXONCTL_PATH + "'; " + commandLine);
}

// The lines of text, without their newlines.
inline std::vector<std::string> linesOf(const std::string& text) {
    std::vector<std::string> out;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) out.push_back(line);
    return out;
}

}  // namespace pyx::test
