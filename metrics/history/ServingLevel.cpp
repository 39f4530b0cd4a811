#include "metrics/history/ServingLevel.h"

#include "metrics/history/Quantity.h"

namespace pyx {
namespace {

// The serving level of each technology, in the order they are preferred: the charts' quantity
// it is, and the lower bounds (dBm) of the classes above "very poor", strongest first.
struct LevelSource {
    Chart chart;
    std::string_view quantity;
    std::string_view technology;
    std::string_view label;
    std::array<double, 4> bounds;
};

constexpr std::array kLevelSources = {
    LevelSource{Chart::LteServing, "RSRP", "LTE", "RSRP", {-80, -90, -100, -110}},
    LevelSource{Chart::UmtsServing, "RSSI", "UMTS", "RSSI", {-60, -70, -80, -90}},
    LevelSource{Chart::GsmServing, "RxLev idle", "GSM", "RxLev", {-70, -80, -90, -100}},
};

const Quantity* quantityOf(const LevelSource& source) {
    for (const Quantity& q : historyQuantities())
        if (q.chart == source.chart && q.name == source.quantity) return &q;
    return nullptr;
}

int classOf(const LevelSource& source, double dBm) {
    for (std::size_t i = 0; i < source.bounds.size(); ++i)
        if (dBm >= source.bounds[i]) return static_cast<int>(i);
    return static_cast<int>(source.bounds.size());
}

}  // namespace

std::optional<ServingLevel> servingLevelOf(const MetricValidator& store) {
    for (const LevelSource& source : kLevelSources) {
        const Quantity* q = quantityOf(source);
        if (q == nullptr) continue;
        const auto& stored = store.dictionary(q->property);
        if (!stored) continue;
        const auto value = singleValue(*q, *stored);
        if (!value) continue;
        return ServingLevel{source.technology, source.label, *value, classOf(source, *value)};
    }
    return std::nullopt;
}

void ServingLevelTracker::update(std::string_view property, const Dict& dictionary,
                                 std::int64_t wallNs) {
    for (std::size_t at = 0; at < kLevelSources.size(); ++at) {
        const LevelSource& source = kLevelSources[at];
        const Quantity* q = quantityOf(source);
        if (q == nullptr || MetricValidator::nameOf(q->property) != property) continue;
        const auto value = singleValue(*q, dictionary);
        if (!value) return;
        int levelClass = 4;
        for (int i = 0; i < 4; ++i) {
            if (*value >= source.bounds[static_cast<std::size_t>(i)]) {
                levelClass = i;
                break;
            }
        }
        heard_[at] =
            Heard{ServingLevel{source.technology, source.label, *value, levelClass}, wallNs};
        return;
    }
}

std::optional<ServingLevel> ServingLevelTracker::current(std::int64_t wallNs) const {
    for (const auto& heard : heard_)
        if (heard && wallNs - heard->wallNs <= kFreshNs) return heard->level;
    return std::nullopt;
}

}  // namespace pyx
