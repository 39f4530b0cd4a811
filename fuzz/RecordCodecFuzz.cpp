// The stored form of recorded events on arbitrary bytes: it reads as a value or gives a
// RecordCodecError, never more; a value that reads, stored again, reads back the same.
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <optional>
#include <span>

#include "recordings/RecordCodec.h"

namespace {

[[noreturn]] void broken(const char* promise) {
    std::fprintf(stderr, "record codec: %s\n", promise);
    std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    // The columns beside the form: a metric ID and a payload, as a recording row has them.
    static constexpr std::uint8_t kPayload[] = {0x08, 0x01, 0x10, 0x02};
    const std::optional<std::int64_t> metricID = 0x3C4E04;
    pyx::Value value;
    try {
        value = pyx::recordings::decodeRecord(std::span(data, size), metricID,
                                              std::span<const std::uint8_t>(kPayload));
    } catch (const pyx::recordings::RecordCodecError& e) {
        if (*e.what() == '\0') broken("an error without a reason");
        return 0;
    }
    pyx::recordings::EncodedRecord again;
    pyx::recordings::encodeRecord(value, again);
    std::optional<std::span<const std::uint8_t>> payload;
    if (again.payload) payload = std::span<const std::uint8_t>(*again.payload);
    const pyx::Value reread = pyx::recordings::decodeRecord(again.form, again.metricID, payload);
    // Compared in stored form, bit for bit (a NaN is not equal to itself as a value).
    pyx::recordings::EncodedRecord third;
    pyx::recordings::encodeRecord(reread, third);
    const bool samePayload = (again.payload == nullptr) == (third.payload == nullptr) &&
                             (again.payload == nullptr || *again.payload == *third.payload);
    if (third.form != again.form || third.metricID != again.metricID || !samePayload)
        broken("a value stored again does not read back the same");
    return 0;
}
