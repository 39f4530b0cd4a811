#include "metrics/history/History.h"

#include <algorithm>
#include <chrono>
#include <cmath>
#include <limits>
#include <stdexcept>

namespace pyx {
namespace {

double systemClockMs() {
    return std::chrono::duration<double, std::milli>(
               std::chrono::system_clock::now().time_since_epoch())
        .count();
}

// The number under key; with convertedAs, converted as that list converts the key.
std::optional<float> numberAt(const Dict& dict, std::string_view key,
                              const ListConversion* convertedAs = nullptr) {
    const Value* value = dict.find(key);
    if (value == nullptr || !value->isNumber() || value->isBool()) return std::nullopt;
    std::optional<Value> converted;
    if (convertedAs != nullptr) {
        for (const KeyConversion& rule : convertedAs->keys) {
            if (rule.key != key) continue;
            try {
                converted = convertValue(rule.conversion, *value, key);
            } catch (const ConversionOverflow&) {
                return std::nullopt;
            }
            break;
        }
        if (converted) value = &*converted;
    }
    const auto number = value->toFloat();
    if (!number || !std::isfinite(*number)) return std::nullopt;
    return number;
}

std::int64_t keyAt(const Dict& dict, std::string_view key) {
    if (key.empty()) return -1;
    const Value* value = dict.find(key);
    if (value == nullptr) return -1;
    return value->toInt64().value_or(-1);
}

const Array* listAt(const Dict& dict, std::string_view key) {
    const Value* value = dict.find(key);
    return value != nullptr && value->isArray() ? &value->asArray() : nullptr;
}

}  // namespace

std::optional<float> singleValue(const Quantity& q, const Dict& stored) {
    switch (q.pick) {
        case Pick::Field: {
            const Dict* holder = &stored;
            if (!q.container.empty()) {
                const Value* nested = stored.find(q.container);
                if (nested == nullptr || !nested->isDict()) return std::nullopt;
                holder = &nested->asDict();
            }
            return numberAt(*holder, q.field, q.convertedAs);
        }
        case Pick::FirstEntry: {
            const Array* list = listAt(stored, q.container);
            if (list == nullptr || list->empty() || !list->front().isDict()) return std::nullopt;
            return numberAt(list->front().asDict(), q.field);
        }
        case Pick::EachEntry:
        case Pick::Strongest:
            break;
    }
    return std::nullopt;
}

History::History() : History(Limits{}) {}

History::History(Limits limits, Clock clock)
    : limits_(limits),
      clock_(clock ? std::move(clock) : Clock(systemClockMs)),
      ofQuantity_(historyQuantities().size()),
      single_(historyQuantities().size(), nullptr),
      byProperty_(MetricValidator::kDictionaryPropertyCount) {
    if (limits_.pointsPerSeries == 0 || !(limits_.windowMs > 0) || limits_.seriesPerQuantity == 0)
        throw std::invalid_argument(
            "History: the window, the points per series and the series "
            "per quantity must be above zero");
    strongest_.reserve(64);
    const auto quantities = historyQuantities();
    for (std::size_t i = 0; i < quantities.size(); ++i)
        byProperty_[static_cast<std::size_t>(quantities[i].property)].push_back(i);
}

double History::timeOf(std::optional<double> eventTimeMs) const {
    if (eventTimeMs && std::isfinite(*eventTimeMs) && *eventTimeMs > 0) return *eventTimeMs;
    return clock_();
}

void History::raiseAllRevisions() {
    for (std::uint64_t& revision : revisions_) ++revision;
}

void History::startSession(double timeMs) {
    for (const auto& series : series_) series->clear();
    newestMs_ = timeMs;
    ++session_;
    raiseAllRevisions();
}

void History::record(MetricValidator::DictionaryProperty property, const Dict& stored,
                     std::optional<double> eventTimeMs) {
    const auto& read = byProperty_[static_cast<std::size_t>(property)];
    if (read.empty()) return;
    const double timeMs = timeOf(eventTimeMs);
    if (!newestMs_) {
        // Every chart now has a time to show its window up to, points or not.
        newestMs_ = timeMs;
        raiseAllRevisions();
    } else if (timeMs + limits_.backwardsToleranceMs < *newestMs_) {
        startSession(timeMs);
    } else if (timeMs > *newestMs_) {
        newestMs_ = timeMs;
    }
    for (const std::size_t quantity : read)
        if (add(quantity, stored, timeMs))
            ++revisions_[static_cast<std::size_t>(historyQuantities()[quantity].chart)];
}

bool History::add(std::size_t quantity, const Dict& stored, double timeMs) {
    const Quantity& q = historyQuantities()[quantity];
    switch (q.pick) {
        case Pick::Field:
        case Pick::FirstEntry: {
            const auto value = singleValue(q, stored);
            if (!value) return false;
            singleFor(quantity).add(timeMs, *value);
            return true;
        }
        case Pick::EachEntry: {
            const Array* list = listAt(stored, q.container);
            if (list == nullptr) return false;
            bool added = false;
            for (const Value& entry : *list) {
                if (!entry.isDict()) continue;
                if (const auto value = numberAt(entry.asDict(), q.field)) {
                    addEntry(quantity, entry.asDict(), *value, timeMs);
                    added = true;
                }
            }
            return added;
        }
        case Pick::Strongest: {
            const Array* list = listAt(stored, q.container);
            if (list == nullptr) return false;
            strongest_.clear();
            for (const Value& entry : *list) {
                if (!entry.isDict()) continue;
                const auto rank = numberAt(entry.asDict(), q.rankField);
                if (rank) strongest_.emplace_back(*rank, &entry.asDict());
            }
            const std::size_t kept = std::min(kStrongestNeighbours, strongest_.size());
            std::partial_sort(strongest_.begin(), strongest_.begin() + static_cast<long>(kept),
                              strongest_.end(),
                              [](const auto& x, const auto& y) { return x.first > y.first; });
            bool added = false;
            for (std::size_t i = 0; i < kept; ++i) {
                const Dict& entry = *strongest_[i].second;
                if (const auto value = numberAt(entry, q.field)) {
                    addEntry(quantity, entry, *value, timeMs, strongest_[i].first);
                    added = true;
                }
            }
            return added;
        }
    }
    return false;
}

void History::addEntry(std::size_t quantity, const Dict& entry, float value, double timeMs,
                       float rank) {
    const Quantity& q = historyQuantities()[quantity];
    seriesFor(SeriesKey{quantity, keyAt(entry, q.keyA), keyAt(entry, q.keyB)})
        .add(timeMs, value, rank);
}

Series& History::singleFor(std::size_t quantity) {
    Series*& single = single_[quantity];
    if (single == nullptr) single = &seriesFor(SeriesKey{quantity});
    return *single;
}

Series& History::seriesFor(SeriesKey key) {
    if (const auto found = index_.find(key); found != index_.end()) return *found->second;
    std::vector<Series*>& ofQuantity = ofQuantity_[key.quantity];
    if (ofQuantity.size() < limits_.seriesPerQuantity) {
        const double slotMs = limits_.windowMs / static_cast<double>(limits_.pointsPerSeries);
        series_.push_back(std::make_unique<Series>(key, limits_.pointsPerSeries, slotMs));
        ofQuantity.push_back(series_.back().get());
        index_.emplace(key, series_.back().get());
        return *series_.back();
    }
    // Full: the series of this quantity fed longest ago gives way.
    Series* stalest = nullptr;
    double stalestMs = std::numeric_limits<double>::infinity();
    for (Series* series : ofQuantity) {
        const double newest = series->points().empty() ? -std::numeric_limits<double>::infinity()
                                                       : series->points().newest().timeMs;
        if (newest < stalestMs) {
            stalestMs = newest;
            stalest = series;
        }
    }
    // The index keeps its node: re-keyed in place, nothing is allocated.
    auto node = index_.extract(stalest->key());
    stalest->rekey(key);
    node.key() = key;
    index_.insert(std::move(node));
    return *stalest;
}

std::vector<const Series*> History::seriesOf(Chart chart, double fromMs) const {
    std::vector<const Series*> out;
    // The newest slot any ranked line of the chart was heard in.
    std::int64_t newestSlot = std::numeric_limits<std::int64_t>::min();
    for (const auto& series : series_) {
        if (series->quantity().chart != chart || series->points().empty() ||
            series->points().newest().timeMs < fromMs)
            continue;
        out.push_back(series.get());
        if (series->quantity().pick == Pick::Strongest)
            newestSlot = std::max(newestSlot, series->points().newest().slot);
    }
    // Lines ranked by strength: those heard in the newest slot or the one before come first,
    // then the rest; each group strongest first by the value the entries were ranked by when
    // last heard. The ranking value is the same for every quantity of an entry, so every
    // panel of the chart lists the same entries in the same order.
    const auto current = [newestSlot](const Series* s) {
        return s->points().newest().slot >= newestSlot - 1;
    };
    std::sort(out.begin(), out.end(), [&current](const Series* x, const Series* y) {
        const SeriesKey& a = x->key();
        const SeriesKey& b = y->key();
        if (a.quantity != b.quantity) return a.quantity < b.quantity;
        if (x->quantity().pick == Pick::Strongest) {
            const bool cx = current(x);
            const bool cy = current(y);
            if (cx != cy) return cx;
            if (x->rank() != y->rank()) return x->rank() > y->rank();
        }
        if (a.a != b.a) return a.a < b.a;
        return a.b < b.b;
    });
    // No more of them than an arrival keeps.
    std::vector<const Series*> kept;
    kept.reserve(out.size());
    std::size_t ofQuantity = 0;
    for (std::size_t i = 0; i < out.size(); ++i) {
        ofQuantity =
            i > 0 && out[i - 1]->key().quantity == out[i]->key().quantity ? ofQuantity + 1 : 0;
        if (out[i]->quantity().pick != Pick::Strongest || ofQuantity < kStrongestNeighbours)
            kept.push_back(out[i]);
    }
    return kept;
}

}  // namespace pyx
