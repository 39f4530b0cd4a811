// The decodable metric kinds, each with our message class and its libprotobuf reference class
// behind plain function pointers, so that a benchmark can walk a mixed corpus record by record.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "core/Value.h"
#include "messages/MessageDescriptor.h"

namespace google::protobuf {
class Descriptor;
}

namespace pyx::bench {

using Payload = std::span<const std::uint8_t>;

struct BenchKind {
    std::int64_t metricID;
    std::string_view messageClass;

    // Typed decode into a fresh message of our class; whether it read.
    bool (*oursDecode)(Payload);
    // Decode and dictionary form; the number of top-level entries (0 when it did not read).
    std::size_t (*oursDictionary)(Payload);
    // libprotobuf: ParseFromArray into a fresh message, or into one kept from call to call.
    bool (*referenceDecodeFresh)(Payload);
    bool (*referenceDecodeReused)(Payload);
    // libprotobuf: parse, then MessageToJsonString; the length of the text (0 on failure).
    std::size_t (*referenceJson)(Payload);

    // For the start-up agreement check: each side decodes and writes the message back.
    std::optional<Bytes> (*oursRoundTrip)(Payload);
    std::optional<std::string> (*referenceRoundTrip)(Payload);
    const MessageDescriptor& (*oursDescriptor)();
    const google::protobuf::Descriptor* (*referenceDescriptor)();
};

// The kinds the intake decodes, in catalogue order.
[[nodiscard]] std::span<const BenchKind> benchKinds();
// The kind of a metric ID, or nullptr.
[[nodiscard]] const BenchKind* benchKindFor(std::int64_t metricID);

// Message classes that no decodable kind reaches (checked against the reference as well).
struct ExtraClass {
    const MessageDescriptor& (*oursDescriptor)();
    const google::protobuf::Descriptor* (*referenceDescriptor)();
};
[[nodiscard]] std::span<const ExtraClass> extraClasses();

}  // namespace pyx::bench
