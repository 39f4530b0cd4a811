// pyxonctl info FILE: what a recording holds, as one JSON object:
//   {"file":"drive.pyxrec","events":1234,"first":"2026-11-23T19:05:50.123456789Z",
//    "last":"...","duration_s":61.5,"kinds":{"0x3C4E04":12,...},"format_version":1,
//    "sessions":[{"id":1,"start":"...","program_version":"0.1.0","source":"sim","seed":1,
//                 "speed":20.0,"host":"car-laptop"}]}
// first and last are null for a recording without events; seed and speed are null where the
// source has none.
#pragma once

#include <iosfwd>
#include <string>

#include "tools/Subcommand.h"

namespace pyx {

// Writes the object and a newline to out, or one line to err; returns the exit code (0, or 1
// for a file that is missing, not a recording, of a newer format or damaged).
int runInfo(const std::string& file, std::ostream& out, std::ostream& err);

Subcommand addInfoCommand(CLI::App& pyxonctl);

}  // namespace pyx
