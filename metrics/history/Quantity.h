// The measured quantities the history keeps, each declared once: which stored dictionary it
// is read from, where in it, its unit, and the chart it belongs to. The values are those the
// screens show: the stored dictionaries after the store's conversions.
#pragma once

#include <optional>
#include <span>
#include <string_view>

#include "metrics/ListConversions.h"
#include "metrics/MetricValidator.h"
#include "metrics/history/Chart.h"

namespace pyx {

enum class Unit { Dbm, Db, RxLev };

[[nodiscard]] constexpr std::string_view unitText(Unit unit) {
    switch (unit) {
        case Unit::Dbm:
            return "dBm";
        case Unit::Db:
            return "dB";
        case Unit::RxLev:
            return "RxLev";
    }
    return {};
}

// Where the value sits in the stored dictionary.
enum class Pick {
    Field,       // field of the dictionary, or of its nested dictionary `container`
    FirstEntry,  // field of the first entry of the list `container`
    EachEntry,   // field of every entry of the list `container`, one series per entry key
    Strongest,   // field of the strongest entries of the list `container` (by rankField)
};

struct Quantity {
    Chart chart;
    std::string_view name;  // "RSRP", "RSRP avg"
    Unit unit;
    MetricValidator::DictionaryProperty property;
    Pick pick;
    std::string_view container;  // empty: the dictionary itself
    std::string_view field;
    // EachEntry and Strongest: the entry fields that tell entries apart, with their labels
    // ("EARFCN", "PCI"); keyB may be empty.
    std::string_view keyA;
    std::string_view labelA;
    std::string_view keyB;
    std::string_view labelB;
    std::string_view rankField;  // Strongest: the higher, the stronger
    // A value the store keeps raw whose twin the screens show converted (the averages of the
    // RSRP/RSRQ/SINR kind): converted as this list converts the same key, so that the chart
    // shows it in the screen's unit.
    const ListConversion* convertedAs = nullptr;
};

// Every quantity, grouped by chart in chart order.
[[nodiscard]] std::span<const Quantity> historyQuantities();

// The value of a quantity of one value (Field, FirstEntry) in a stored dictionary of its
// kind, as the screens show it; nothing when it is absent (or for a per-entry quantity).
[[nodiscard]] std::optional<float> singleValue(const Quantity& q, const Dict& stored);

// How many neighbours are kept per arrival: the strongest ones.
inline constexpr std::size_t kStrongestNeighbours = 8;

}  // namespace pyx
