// pyxonctl decode: runs JSON Lines metric records through the store's intake and prints, for
// each input line, one JSON line saying where the record landed, that it was not cared for,
// or why it was refused.
#pragma once

#include <cstdint>
#include <iosfwd>
#include <optional>
#include <string>
#include <string_view>

#include "metrics/MetricValidator.h"
#include "tools/Subcommand.h"

namespace pyx {

// Where one record landed after the store's intake, as the application path takes it.
struct DecodeOutcome {
    std::optional<std::int64_t> metricID;  // as the store read it
    std::optional<std::string> error;      // the store refused the record: why
    bool ignored = false;                  // a kind the store does not keep
    std::string property;                  // the store property that now holds it
    const Dict* dictionary = nullptr;      // its decoded, converted dictionary (the store's)
};

// Runs record through validator's intake (metricsDidUpdate) and says where it landed. The
// dictionary stays valid until the next record goes in.
[[nodiscard]] DecodeOutcome decodeRecord(MetricValidator& validator, const MetricRecord& record);

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
