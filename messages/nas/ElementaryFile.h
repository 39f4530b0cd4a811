// One SIM elementary file and its raw content.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_ElementaryFile(F)          \
    F##_U32(1, "ef_id", efId, EfId)           \
    F##_BYTES(2, "content", content, Content)
// clang-format on

namespace pyx {

class ElementaryFile {
    PYX_MESSAGE_BODY(ElementaryFile)
};

}  // namespace pyx
