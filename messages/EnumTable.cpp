#include "messages/EnumTable.h"

#include "core/Format.h"

namespace pyx {

std::string EnumTable::nameOf(std::int32_t value) const {
    const std::string_view name = find(value);
    if (!name.empty()) return std::string(name);
    return format("(unknown: %i)", value);
}

}  // namespace pyx
