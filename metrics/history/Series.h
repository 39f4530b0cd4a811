// One charted line: a quantity, for one entity where the quantity has several (a carrier, a
// neighbour), with its points.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

#include "metrics/history/Quantity.h"
#include "metrics/history/SeriesRing.h"

namespace pyx {

// Which line: the quantity's place in historyQuantities() and, for per-entry quantities, the
// entry's key fields (-1 when unused).
struct SeriesKey {
    std::size_t quantity = 0;
    std::int64_t a = -1;
    std::int64_t b = -1;
    friend bool operator==(const SeriesKey&, const SeriesKey&) = default;
};

class Series {
  public:
    Series(SeriesKey key, std::size_t capacity, double slotMs);

    [[nodiscard]] const SeriesKey& key() const { return key_; }
    [[nodiscard]] const Quantity& quantity() const;
    // The entity: "CC 1", "ARFCN 58", "6300/118" (EARFCN/PCI); empty for a quantity of the
    // serving cell.
    [[nodiscard]] const std::string& entity() const { return entity_; }
    // What a legend says: "RSRP avg", "CC 1 RSRQ", "6300/118".
    [[nodiscard]] std::string label() const;
    [[nodiscard]] const SeriesRing& points() const { return ring_; }

    // What the entry was ranked by when its latest point was added (a neighbour's RSRP for
    // its RSRQ line too); 0 for a quantity not ranked by strength.
    [[nodiscard]] float rank() const { return rank_; }

    // Reuses the series for another key; its points are dropped.
    void rekey(SeriesKey key);
    void add(double timeMs, float value, float rank = 0) {
        ring_.add(timeMs, value);
        rank_ = rank;
    }
    void clear() {
        ring_.clear();
        rank_ = 0;
    }

  private:
    void describe();

    SeriesKey key_;
    std::string entity_;
    SeriesRing ring_;
    float rank_ = 0;
};

}  // namespace pyx
