// The activated bearer (PDP) contexts, with their count as reported.
#pragma once

#include "messages/Message.h"
#include "messages/nas/BearerContext.h"

// clang-format off
#define PYX_FIELDS_KCellularActivatedBearerContexts(F)                                                          \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                                               \
    F##_U32(2, "bearer_context_count", bearerContextCount, BearerContextCount)                                  \
    F##_MSGS(3, "bearer_contexts", bearerContexts, BearerContexts, bearerContext, BearerContext, BearerContext)
// clang-format on

namespace pyx {

class KCellularActivatedBearerContexts {
    PYX_MESSAGE_BODY(KCellularActivatedBearerContexts)
};

}  // namespace pyx
