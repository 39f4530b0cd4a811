#include "messages/KBBMetricUtility.h"

#include "core/Log.h"

namespace pyx {

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
