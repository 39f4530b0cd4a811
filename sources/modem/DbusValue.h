// The D-Bus edge of the ModemManager source: sdbus-c++ variants become our own values, so
// that everything past this file (the field table, the payloads) knows no D-Bus library.
#pragma once

#include <map>
#include <string>

#include <sdbus-c++/Types.h>

#include "core/Value.h"

namespace pyx::modem {

// d becomes a float, u/q/y/t unsigned, i/n/x signed, b a bool, s/o a string, ay bytes,
// a{sv} a Dict, any other array an Array; any other type is an empty Value (which every row
// of the field table refuses as of the wrong type).
[[nodiscard]] Value toValue(const sdbus::Variant& variant);
[[nodiscard]] Dict toDict(const std::map<std::string, sdbus::Variant>& dictionary);

}  // namespace pyx::modem
