#include "messages/KBBMetricUtility.h"

#include "core/Log.h"

namespace pyx {

namespace {

constexpr bool tagsAreDistinct() {
    const auto& rows = KBBMetricUtility::kEntries;
    for (std::size_t i = 0; i < rows.size(); ++i) {
        for (std::size_t j = 0; j < i; ++j) {
            if (rows[i].tag == rows[j].tag) return false;
        }
    }
    return true;
}
static_assert(tagsAreDistinct(), "one row per metric tag");

}  // namespace

std::string_view KBBMetricUtility::classNameForTag(std::uint16_t tag) {
    for (const Entry& e : kEntries) {
        if (e.tag == tag) return e.className;
    }
    return {};
}

void KBBMetricUtility::logValidTag() {
    systemLog("valid metricId tag");
}

}  // namespace pyx
