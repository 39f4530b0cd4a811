// pyxonctl export FILE --format jsonl|csv: the metric events of a recording for other tools.
//
// jsonl: one line per event, in order, the record as pyxonctl listen prints it with the time
// of arrival first: {"time": "2026-11-23T19:05:50.123456789Z", "kKeyMetricID": 3952132,
// "kKeyPayload": "0a08...", ...}; decode and screen read it as it is.
//
// csv: one row per event the store decodes: time, metric (hex), property (the store's) and a
// column per scalar field of its decoded, converted dictionary (nested keys joined with dots,
// list entries by index: inst_values.0.rsrp0); the header is the union of the columns in the
// order first seen; RFC 4180 quoting. A record the store refuses is skipped with one line on
// stderr, and counted in a summary line at the end.
#pragma once

#include <iosfwd>
#include <optional>
#include <string>
#include <vector>

#include "core/Value.h"
#include "recordings/RecordedEvent.h"
#include "tools/Subcommand.h"

namespace pyx {

struct ExportRequest {
    std::string file;
    std::string format = "jsonl";     // jsonl or csv
    std::vector<std::string> kinds;   // metric IDs in hex ("0x3C4E04" or "3C4E04")
    std::optional<std::string> from;  // ISO 8601 times (see tools/IsoTime.h)
    std::optional<std::string> to;
};

// The jsonl line of one event, without its newline, appended to out.
void appendExportLine(std::string& out, const recordings::RecordedEvent& event);

// Writes the export to out and what went wrong to err (one line each). Returns 0; 1 when the
// file cannot be read (nothing written) or breaks off (what was read before is written, and a
// line says how many events that was) or when out cannot be written; 2 for a request that does
// not make sense.
int runExport(const ExportRequest& request, std::ostream& out, std::ostream& err);

Subcommand addExportCommand(CLI::App& pyxonctl);

}  // namespace pyx
