// The metric kinds the ModemManager source writes, and their payloads, written with our
// message classes from what the modem said. A kind the modem has nothing for has no payload; a
// value that its message field cannot hold is left out, with one line in the issues.
#pragma once

#include <cstdint>
#include <optional>
#include <span>

#include "core/Value.h"
#include "sources/modem/ModemReading.h"

namespace pyx::modem {

using PayloadWriter = std::optional<Bytes> (*)(const ModemReading& reading, std::uint64_t timestamp,
                                               FieldIssues& issues);

struct ModemKind {
    std::int64_t metricID;  // the catalogue's ID; its message class is the catalogue's
    PayloadWriter write;
};

// Every kind this source writes, one row each.
[[nodiscard]] std::span<const ModemKind> modemKinds();
[[nodiscard]] const ModemKind* findModemKind(std::int64_t metricID);

// The SIM files kind (sim::kSimFilesMetricID), also written (possibly without files) when the
// SIM is asked for.
[[nodiscard]] Bytes simFilesPayload(const ModemReading& reading, std::uint64_t timestamp);

}  // namespace pyx::modem
