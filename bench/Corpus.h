// The benchmark corpus: JSON Lines records as pyxonctl reads them, with the label the corpus
// generator gives each one. Realistic records carry the message class as label; the large,
// built ones a label beginning with "large:".
#pragma once

#include <cstdint>
#include <span>
#include <stdexcept>
#include <string>
#include <vector>

#include "baseband/MetricRecord.h"
#include "core/Value.h"

namespace pyx::bench {

struct CorpusRecord {
    std::int64_t metricID = 0;
    Bytes payload;
    std::string label;
    bool large = false;
    MetricRecord record;  // as the baseband client hands it to the store

    [[nodiscard]] std::span<const std::uint8_t> bytes() const { return payload; }
};

// A corpus file that cannot be used: unreadable, or a line that is not a metric record with an
// integer ID and a payload. Names the file and the line.
class CorpusError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// Every record of the file, in file order. Throws CorpusError.
[[nodiscard]] std::vector<CorpusRecord> loadCorpus(const std::string& path);

}  // namespace pyx::bench
