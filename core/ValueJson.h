// The JSON form of a Value, for the tools: numbers as JSON numbers, booleans as true/false,
// bytes as a string of lowercase hex digits, strings as strings, arrays as arrays, and
// dictionaries as objects in their own key order.
#pragma once

#include <nlohmann/json.hpp>

#include "core/Value.h"

namespace pyx {

[[nodiscard]] nlohmann::ordered_json toJson(const Value& value);

}  // namespace pyx
