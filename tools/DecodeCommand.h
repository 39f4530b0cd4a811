// pyxonctl decode: runs JSON Lines metric records through the store's intake and prints, for
// each input line, one JSON line saying where the record landed, that it was not cared for,
// or why it was refused.
#pragma once

#include <iosfwd>
#include <string>
#include <string_view>

#include "metrics/MetricValidator.h"
#include "tools/Subcommand.h"

namespace pyx {

// The JSON line for one input line, after running it through validator:
//   {"metric":"0x3CD302","property":"myLTETxPowerDict","dict":{...}}
//   {"metric":"0x3CD301","ignored":true}
//   {"metric":"0x3CD302" or null,"error":"what was wrong"}
[[nodiscard]] std::string decodeLine(MetricValidator& validator, std::string_view line);

// Decodes every line of in, in order, through one store without a baseband client, writing
// one JSON line per input line to out. Returns 0 once all input is read.
int runDecode(std::istream& in, std::ostream& out);

// Adds "decode" to pyxonctl. The store's own standard-output lines go to stderr while it
// runs, so stdout carries only the JSON lines.
Subcommand addDecodeCommand(CLI::App& pyxonctl);

}  // namespace pyx
