// The dictionary of one baseband event, as the client hands it to its delegate. Its keys are
// the velk key constants ("kKeyMetricID", "kKeyPayload", "kKeyProfileID", ...).
#pragma once

#include "core/Value.h"

namespace pyx {

using MetricRecord = Dict;

}  // namespace pyx
