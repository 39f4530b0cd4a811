// Enumeration name tables: the (value, name) pairs of one enumeration, in ascending value
// order, and the name lookup used by the dictionary form.
//
// One X-macro list per enumeration generates both the named constants (an unscoped enum in
// namespace pyx, so KLTE_RRC_STATE_IDLE is a plain int32 constant) and the name table:
//
//   #define PYX_ENUM_LteRrcState(E) E(0, KLTE_RRC_STATE_NULL) E(1, KLTE_RRC_STATE_IDLE) ...
//   PYX_DECLARE_ENUM(LteRrcState)        // enum LteRrcState + kLteRrcStateNames
//   PYX_DECLARE_ENUM_NAMES(WcdmaDuplexMode)  // only the table (its names are declared elsewhere)
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace pyx {

struct EnumEntry {
    std::int32_t value;
    std::string_view name;
};

struct EnumTable {
    const EnumEntry* entries;
    std::size_t count;

    // The name of value, or nullptr-equivalent (empty view) when the table has none.
    [[nodiscard]] constexpr std::string_view find(std::int32_t value) const {
        // Most tables run 0, 1, 2, ... without gaps: index directly when the slot matches.
        if (value >= 0 && static_cast<std::size_t>(value) < count &&
            entries[value].value == value) {
            return entries[value].name;
        }
        std::size_t lo = 0;
        std::size_t hi = count;
        while (lo < hi) {
            const std::size_t mid = lo + (hi - lo) / 2;
            if (entries[mid].value < value) {
                lo = mid + 1;
            } else {
                hi = mid;
            }
        }
        return lo < count && entries[lo].value == value ? entries[lo].name : std::string_view{};
    }

    // The display text: the enumerator's name, or "(unknown: %i)" for a value with no name.
    [[nodiscard]] std::string nameOf(std::int32_t value) const;
};

namespace detail {
template <std::size_t N>
constexpr bool ascending(const EnumEntry (&entries)[N]) {
    for (std::size_t i = 1; i < N; ++i) {
        if (entries[i - 1].value >= entries[i].value) return false;
    }
    return true;
}
}  // namespace detail

}  // namespace pyx

#define PYX_ENUM_CONSTANT(value, NAME) NAME = value,
#define PYX_ENUM_ENTRY(value, NAME) ::pyx::EnumEntry{value, #NAME},

#define PYX_DECLARE_ENUM_NAMES(Enum)                                                          \
    inline constexpr ::pyx::EnumEntry k##Enum##Entries[] = {PYX_ENUM_##Enum(PYX_ENUM_ENTRY)}; \
    static_assert(::pyx::detail::ascending(k##Enum##Entries));                                \
    inline constexpr ::pyx::EnumTable k##Enum##Names{                                         \
        k##Enum##Entries, sizeof(k##Enum##Entries) / sizeof(k##Enum##Entries[0])};

#define PYX_DECLARE_ENUM(Enum)                                       \
    enum Enum : std::int32_t { PYX_ENUM_##Enum(PYX_ENUM_CONSTANT) }; \
    PYX_DECLARE_ENUM_NAMES(Enum)
