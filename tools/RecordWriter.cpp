#include "tools/RecordWriter.h"

#include <charconv>
#include <string_view>

#include "baseband/velk/Names.h"
#include "core/ValueJson.h"

namespace pyx {
namespace {

bool isPlainKey(std::string_view key) {
    for (const char c : key) {
        const bool plain = (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') ||
                           (c >= '0' && c <= '9') || c == '_' || c == '.' || c == '-';
        if (!plain) return false;
    }
    return true;
}

void appendJsonText(std::string& out, const Value& value) {
    out += toJson(value).dump(-1, ' ', false, nlohmann::json::error_handler_t::replace);
}

void appendKey(std::string& out, std::string_view key) {
    if (isPlainKey(key)) {
        out += '"';
        out += key;
        out += '"';
    } else {
        appendJsonText(out, Value(key));
    }
}

void appendInteger(std::string& out, auto value) {
    char digits[24];
    const auto [end, error] = std::to_chars(digits, digits + sizeof digits, value);
    static_cast<void>(error);
    out.append(digits, end);
}

// The common kinds written directly; the others as their JSON forms.
void appendValue(std::string& out, const Value& value) {
    static constexpr char kHex[] = "0123456789abcdef";
    switch (value.kind()) {
        case Value::Kind::Int:
            appendInteger(out, value.asInt());
            return;
        case Value::Kind::UInt:
            appendInteger(out, value.asUInt());
            return;
        case Value::Kind::Data: {
            const Bytes& bytes = value.asBytes();
            const std::size_t at = out.size();
            out.resize(at + 2 + bytes.size() * 2);
            char* p = out.data() + at;
            *p++ = '"';
            for (const std::uint8_t b : bytes) {
                *p++ = kHex[b >> 4];
                *p++ = kHex[b & 15];
            }
            *p = '"';
            return;
        }
        default:
            appendJsonText(out, value);
            return;
    }
}

void appendEntry(std::string& out, bool& first, std::string_view key, const Value& value) {
    if (!first) out += ", ";
    first = false;
    appendKey(out, key);
    out += ": ";
    appendValue(out, value);
}

}  // namespace

void appendRecordFields(std::string& out, const MetricRecord& record) {
    const Value* metricID = record.find(velk::kKeyMetricID);
    const Value* payload = record.find(velk::kKeyPayload);
    bool first = true;
    if (metricID) appendEntry(out, first, velk::kKeyMetricID, *metricID);
    if (payload) appendEntry(out, first, velk::kKeyPayload, *payload);
    for (const auto& entry : record) {
        if (&entry.value != metricID && &entry.value != payload)
            appendEntry(out, first, entry.key, entry.value);
    }
}

std::string recordLine(const MetricRecord& record) {
    std::string line = "{";
    appendRecordFields(line, record);
    line += '}';
    return line;
}

}  // namespace pyx
