// The metric-tag table: the 16-bit tags of the metric IDs whose payloads the decoders know.
// The message readers ask it about every field number they meet; a field whose number is a
// metric tag is never stored.
#pragma once

#include <array>
#include <concepts>
#include <cstddef>
#include <cstdint>
#include <string_view>
#include <utility>

#include "core/MetricKindList.h"
#include "messages/MessageDescriptor.h"

namespace pyx {

class KBBMetricUtility {
  public:
    struct Entry {
        std::uint16_t tag;
        std::string_view className;
    };

    // The rows: the tag and the class-name text it stands for (texts kept as the baseband
    // names them, lower-case "k" included), for every kind of the list of metric kinds that
    // has a tag text. Only the tag (the low 16 bits of the metric ID) is read here.
    static constexpr std::size_t kRowCount = [] {
        std::size_t count = 0;
#define PYX_COUNT_TAG(constant, id, decoding, store, logPrefix, work, tagText, ...) \
    if (!std::string_view(tagText).empty()) ++count;
        PYX_METRIC_KINDS(PYX_COUNT_TAG)
#undef PYX_COUNT_TAG
        return count;
    }();

    static constexpr std::array<Entry, kRowCount> kEntries = [] {
        std::array<Entry, kRowCount> rows{};
        std::size_t n = 0;
#define PYX_TAG_ROW(constant, id, decoding, store, logPrefix, work, tagText, ...) \
    if (!std::string_view(tagText).empty()) {                                     \
        rows[n++] = Entry{static_cast<std::uint16_t>((id)&0xFFFF), tagText};      \
    }
        PYX_METRIC_KINDS(PYX_TAG_ROW)
#undef PYX_TAG_ROW
        return rows;
    }();

    // Whether tag is a metric tag; logs "valid metricId tag" when it is. The class is not
    // consulted: a metric tag is one for every message class.
    static bool isValidMetricIdTag(std::uint16_t tag, const MessageDescriptor& forClass) {
        (void)forClass;
        if (((bits()[tag >> 6] >> (tag & 63)) & 1U) == 0) return false;
        logValidTag();
        return true;
    }

    // Any other integer (a whole metric ID, a negative number) is compared by value: only a
    // value that is itself one of the 16-bit tags is valid.
    template <std::integral Int>
    requires(!std::same_as<Int, std::uint16_t> &&
             !std::same_as<Int, bool>) static bool isValidMetricIdTag(Int tag,
                                                                      const MessageDescriptor&
                                                                          forClass) {
        if (std::cmp_less(tag, 0) || std::cmp_greater(tag, 0xFFFF)) return false;
        return isValidMetricIdTag(static_cast<std::uint16_t>(tag), forClass);
    }

    // The class-name text of a metric tag, empty when it is none.
    static std::string_view classNameForTag(std::uint16_t tag);

  private:
    using Bits = std::array<std::uint64_t, 1024>;
    static constexpr Bits buildBits() {
        Bits b{};
        for (const Entry& e : kEntries) b[e.tag >> 6] |= std::uint64_t{1} << (e.tag & 63);
        return b;
    }
    // One bit per possible tag, built once (at compile time).
    static const Bits& bits() {
        static constexpr Bits kBits = buildBits();
        return kBits;
    }
    static void logValidTag();
};

}  // namespace pyx
