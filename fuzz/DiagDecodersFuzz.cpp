// Every DIAG decoder row on arbitrary payloads: a row takes the payload or refuses it, reads
// nothing past it (AddressSanitizer), and whatever it writes decodes with its kind's message
// class.
//
// Input: the first two bytes (little endian) pick the row, modulo the number of rows (see
// DiagRows.h); the rest is the payload. A row of one version gets its version as payload[0],
// as the stream would hand it only such packets.
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <variant>
#include <vector>

#include "fuzz/DiagRows.h"
#include "metrics/MetricCatalogue.h"
#include "sources/diag/DecodeState.h"

namespace {

[[noreturn]] void broken(const char* row, const char* promise) {
    std::fprintf(stderr, "diag decoder %s: %s\n", row, promise);
    std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const auto& rows = pyx::fuzz::diagRows();
    if (size < 2 || rows.empty()) return 0;
    const pyx::fuzz::DiagRow& row = rows[(data[0] | data[1] << 8) % rows.size()];
    // A copy of exactly the payload's size, so that a read past it is seen.
    pyx::Bytes payload(data + 2, data + size);
    pyx::diag::DecodeState state;
    std::vector<pyx::diag::MetricOut> out;
    bool taken = false;
    std::string_view name;
    if (row.log != nullptr) {
        name = row.log->name;
        if (row.log->version != pyx::diag::kAnyVersion) {
            if (payload.empty()) return 0;
            payload[0] = static_cast<std::uint8_t>(row.log->version);
        }
        pyx::diag::LogPacket packet;
        packet.code = row.log->code;
        packet.timeMs = 1600000000000ULL;
        packet.payload = payload;
        taken = row.log->decode(packet, state, out);
    } else {
        name = row.event->name;
        pyx::diag::EventReport event;
        event.id = row.event->id;
        event.timeMs = 1600000000000ULL;
        event.payload = payload;
        taken = row.event->decode(event, state, out);
    }
    const std::string rowName(name);
    if (!taken) return 0;
    for (const pyx::diag::MetricOut& e : out) {
        const pyx::MetricKind* kind = pyx::findMetricKind(e.metricID);
        if (kind == nullptr || !kind->decodable()) broken(rowName.c_str(), "an unknown kind");
        if (!std::holds_alternative<pyx::Dict>(kind->decode(e.payload)))
            broken(rowName.c_str(), "an event its kind's class does not read");
    }
    return 0;
}
