#include "tools/RecordReader.h"

#include <limits>
#include <nlohmann/json.hpp>

namespace pyx {

RecordError::RecordError(std::optional<std::int64_t> metricID, std::string reason)
    : std::runtime_error(reason), metricID_(metricID), reason_(std::move(reason)) {}

namespace {

constexpr std::string_view kMetricIDKey = "kKeyMetricID";
constexpr std::string_view kPayloadKey = "kKeyPayload";

int hexDigit(char c) {
    if (c >= '0' && c <= '9') return c - '0';
    if (c >= 'a' && c <= 'f') return c - 'a' + 10;
    if (c >= 'A' && c <= 'F') return c - 'A' + 10;
    return -1;
}

// The metric ID as a value of the record, or nothing for a list or an object.
std::optional<Value> metricIDValue(const nlohmann::json& id) {
    using T = nlohmann::json::value_t;
    switch (id.type()) {
        case T::number_integer:
            return Value(id.get<std::int64_t>());
        case T::number_unsigned: {
            const auto u = id.get<std::uint64_t>();
            if (u <= static_cast<std::uint64_t>(std::numeric_limits<std::int64_t>::max()))
                return Value(static_cast<std::int64_t>(u));
            return Value(u);
        }
        case T::number_float:
            return Value(id.get<float>());
        case T::string:
            return Value(id.get<std::string>());
        case T::boolean:
            return Value(id.get<bool>());
        case T::null:
            return Value();
        default:
            return std::nullopt;
    }
}

}  // namespace

std::optional<Bytes> bytesFromHex(std::string_view hex) {
    if (hex.size() % 2 != 0) return std::nullopt;
    Bytes bytes;
    bytes.reserve(hex.size() / 2);
    for (std::size_t i = 0; i < hex.size(); i += 2) {
        const int high = hexDigit(hex[i]);
        const int low = hexDigit(hex[i + 1]);
        if (high < 0 || low < 0) return std::nullopt;
        bytes.push_back(static_cast<std::uint8_t>(high * 16 + low));
    }
    return bytes;
}

MetricRecord readRecord(std::string_view line) {
    const auto json = nlohmann::json::parse(line, nullptr, /*allow_exceptions=*/false);
    if (json.is_discarded()) throw RecordError(std::nullopt, "the line is not JSON");
    if (!json.is_object()) throw RecordError(std::nullopt, "the line is not a JSON object");

    MetricRecord record;
    std::optional<std::int64_t> knownID;
    if (const auto id = json.find(kMetricIDKey); id != json.end()) {
        auto value = metricIDValue(*id);
        if (!value) throw RecordError(std::nullopt, "kKeyMetricID is a list or an object");
        if (value->isInt()) knownID = value->asInt();
        record.append(std::string(kMetricIDKey), std::move(*value));
    }
    if (const auto payload = json.find(kPayloadKey); payload != json.end()) {
        if (!payload->is_string()) throw RecordError(knownID, "kKeyPayload is not a string");
        auto bytes = bytesFromHex(payload->get_ref<const std::string&>());
        if (!bytes) throw RecordError(knownID, "kKeyPayload is not an even number of hex digits");
        record.append(std::string(kPayloadKey), Value(std::move(*bytes)));
    }
    return record;
}

}  // namespace pyx
