// Every DIAG decoder row, log tables first (in logDecoderTables() order), then the event rows:
// the decoder fuzz target picks one by its index, and the seed writer writes one seed per row.
#pragma once

#include <vector>

#include "sources/diag/LogDecoder.h"

namespace pyx::fuzz {

struct DiagRow {
    const diag::LogDecoderRow* log = nullptr;  // one of the two
    const diag::EventDecoderRow* event = nullptr;
};

inline const std::vector<DiagRow>& diagRows() {
    static const std::vector<DiagRow> rows = [] {
        std::vector<DiagRow> all;
        for (const auto table : diag::logDecoderTables())
            for (const diag::LogDecoderRow& row : table) all.push_back({&row, nullptr});
        for (const diag::EventDecoderRow& row : diag::eventDecoders())
            all.push_back({nullptr, &row});
        return all;
    }();
    return rows;
}

}  // namespace pyx::fuzz
