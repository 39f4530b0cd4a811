// The catalogue of metric kinds: for each known metric ID its constant, the message class
// that decodes its payload, the dictionary property that keeps its latest value, the line
// printed on its arrival and its kind-specific work. Each kind is declared once, here.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string_view>
#include <variant>

#include "messages/DecodeError.h"
#include "metrics/KindWork.h"
#include "metrics/MetricValidator.h"

namespace pyx {

// The dictionary form of a payload decoded with one message class, or why the class refuses
// the bytes.
using DecodeResult = std::variant<Dict, DecodeError>;
using DecodeFunction = DecodeResult (*)(std::span<const std::uint8_t> payload);

struct MetricKind {
    std::int64_t id;
    const std::int64_t MetricValidator::*constant;
    std::string_view constantName;
    std::string_view messageClass;  // empty for the kinds that are not decoded
    DecodeFunction decode;          // nullptr: the kind is not cared for
    std::optional<MetricValidator::DictionaryProperty> property;
    std::string_view logPrefix;
    KindWork work;  // nullptr: the stored dictionary is the decoded one, timestamp rewritten

    [[nodiscard]] bool decodable() const { return decode != nullptr; }
};

// The 32 kinds, in the order of the K_* constants.
[[nodiscard]] std::span<const MetricKind> metricCatalogue();

// The kind of a metric ID, or nullptr for an ID the catalogue does not know.
[[nodiscard]] const MetricKind* findMetricKind(std::int64_t metricID);

}  // namespace pyx
