// pyxonctl's JSON Lines record reader on arbitrary lines: a line is either a record or a
// RecordError. A record with an integer ID and a data payload, written back as a line, reads
// to the same record; hex text and bytes convert both ways.
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>

#include "tools/RecordReader.h"

namespace {

[[noreturn]] void broken(const char* promise) {
    std::fprintf(stderr, "record reader: %s\n", promise);
    std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string line(reinterpret_cast<const char*>(data), size);
    pyx::MetricRecord record;
    try {
        record = pyx::readRecord(line);
    } catch (const pyx::RecordError& e) {
        if (e.reason().empty()) broken("an error without a reason");
        return 0;
    }

    const pyx::Value* id = record.find("kKeyMetricID");
    const pyx::Value* payload = record.find("kKeyPayload");
    if (payload != nullptr && !payload->isBytes()) broken("a payload that is not data");
    if (payload != nullptr) {
        const auto again = pyx::bytesFromHex(pyx::hexString(payload->asBytes()));
        if (!again || *again != payload->asBytes()) broken("hex text does not convert back");
    }
    if (id != nullptr && id->isInt() && payload != nullptr) {
        const std::string written = "{\"kKeyMetricID\": " + std::to_string(id->asInt()) +
                                    ", \"kKeyPayload\": \"" + pyx::hexString(payload->asBytes()) +
                                    "\"}";
        const pyx::MetricRecord reread = pyx::readRecord(written);
        const pyx::Value* id2 = reread.find("kKeyMetricID");
        const pyx::Value* payload2 = reread.find("kKeyPayload");
        if (id2 == nullptr || !(*id2 == *id)) broken("the metric ID does not read back");
        if (payload2 == nullptr || !(*payload2 == *payload))
            broken("the payload does not read back");
    }
    return 0;
}
