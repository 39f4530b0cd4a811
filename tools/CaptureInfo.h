// pyxonctl info on a raw DIAG capture (.qmdl, .mi2log, a --qmdl file): what the stream holds,
// as one JSON object:
//   {"file":"drive.qmdl","kind":"diag capture","bytes":524026,"frames":1808,"bad_frames":0,
//    "cut_short_bytes":0,"malformed":0,"first":"2016-01-12T21:49:05.123Z","last":"...",
//    "logs":[{"code":"0xB193","version":1,"name":"LTE ML1 serving cell meas response",
//             "decoded":1091,"not_decoded":0},...],
//    "events":[{"id":1606,"decoded":3,"not_decoded":0}],"other_commands":{"0x7C":1},
//    "subscriptions":{"1":1756}}
// first and last are the modem's own clock (null when it was never set); name is null for a
// code no decoder knows; subscriptions is empty for a single-SIM modem.
#pragma once

#include <iosfwd>
#include <optional>
#include <string>

namespace pyx {

// Writes the object and a newline to out and returns 0; nothing when the file holds no DIAG
// frame at all (it is then neither a recording nor a capture).
[[nodiscard]] std::optional<int> runCaptureInfo(const std::string& file, std::ostream& out);

}  // namespace pyx
