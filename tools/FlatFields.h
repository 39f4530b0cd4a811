// A decoded dictionary as flat named fields, the way the csv and the map exports write an
// event's values: one text per scalar field, named by its path ("inst_values.0.rsrp0").
#pragma once

#include <functional>
#include <string>

#include "core/Value.h"

namespace pyx {

using Scalar = std::function<void(const std::string& path, const Value& value)>;

// Calls scalar with each scalar field of dict, depth first in the dictionary's order; path is
// the caller's scratch (empty at the start).
void flatten(const Dict& dict, std::string& path, const Scalar& scalar);
void flatten(const Value& value, std::string& path, const Scalar& scalar);

// A scalar as the csv writes it: integers as they are, floats shortest, bytes in hex, null empty.
[[nodiscard]] std::string cellText(const Value& value);

}  // namespace pyx
