#include "tools/RecordWriter.h"

#include <array>
#include <string_view>

#include "baseband/velk/Names.h"
#include "core/ValueJson.h"

namespace pyx {
namespace {

void appendJson(std::string& line, std::string_view key, const Value& value) {
    if (line.size() > 1) line += ", ";
    line += nlohmann::ordered_json(std::string(key)).dump();
    line += ": ";
    line += toJson(value).dump(-1, ' ', false, nlohmann::json::error_handler_t::replace);
}

}  // namespace

std::string recordLine(const MetricRecord& record) {
    std::string line = "{";
    constexpr std::array<std::string_view, 2> first{velk::kKeyMetricID, velk::kKeyPayload};
    for (const std::string_view key : first) {
        if (const Value* value = record.find(key)) appendJson(line, key, *value);
    }
    for (const auto& entry : record) {
        if (entry.key != first[0] && entry.key != first[1])
            appendJson(line, entry.key, entry.value);
    }
    line += "}";
    return line;
}

}  // namespace pyx
