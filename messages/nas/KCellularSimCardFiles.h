// The SIM card's elementary files.
#pragma once

#include "messages/Message.h"
#include "messages/nas/ElementaryFile.h"

// clang-format off
#define PYX_FIELDS_KCellularSimCardFiles(F)                                  \
    F##_U64(1, "timestamp", timestamp, Timestamp)                            \
    F##_MSGS(2, "ef_list", efLists, EfLists, efList, EfList, ElementaryFile)
// clang-format on

namespace pyx {

class KCellularSimCardFiles {
    PYX_MESSAGE_BODY(KCellularSimCardFiles)
};

}  // namespace pyx
