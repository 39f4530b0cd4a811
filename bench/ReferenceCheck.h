// Before anything is measured: our message classes and the libprotobuf reference schemas
// agree field by field (number, name, type, label, packing, enumerators), and on every corpus
// record both decoders read the same fields (each writes back the same bytes).
#pragma once

#include <ostream>
#include <vector>

#include "bench/Corpus.h"

namespace pyx::bench {

// Writes one line per disagreement to out; true when there is none.
[[nodiscard]] bool checkReference(const std::vector<CorpusRecord>& corpus, std::ostream& out);

}  // namespace pyx::bench
