// The recent past of the measured quantities, for the charts. On every stored arrival the
// store hands the stored dictionary over; each quantity of that kind found in it is added to
// its series as a (time, value) point. The time is the event's own timestamp, so a replay
// charts the recorded times; without one, the arrival time.
//
// Memory is bounded whatever the run length: each series is a ring of a fixed number of
// time slots spanning the window, values within one slot are merged keeping their minimum and
// maximum, and per-entry quantities keep a fixed number of series (the least recently fed
// one gives way). Once every series exists, adding a point neither allocates nor depends on
// the run length. A time that goes back further than a few seconds (a replay started over)
// begins a new session: every series starts empty.
//
// Like the store, it belongs to the main thread.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <unordered_map>
#include <utility>
#include <vector>

#include "core/Value.h"
#include "metrics/MetricValidator.h"
#include "metrics/history/Chart.h"
#include "metrics/history/Series.h"

namespace pyx {

class History {
  public:
    struct Limits {
        double windowMs = 30.0 * 60 * 1000;
        std::size_t pointsPerSeries = 900;  // slots of windowMs / pointsPerSeries (2 s)
        std::size_t seriesPerQuantity = 16;
        double backwardsToleranceMs = 5000;
    };
    // Milliseconds since 1970, for arrivals without a timestamp of their own.
    using Clock = std::function<double()>;

    History();
    explicit History(Limits limits, Clock clock = {});

    // One stored arrival of the kind kept in property: stored is the dictionary the store
    // keeps; eventTimeMs the event's own timestamp (nothing, or not above 0: the arrival
    // time is used instead).
    void record(MetricValidator::DictionaryProperty property, const Dict& stored,
                std::optional<double> eventTimeMs);

    // The series of a chart with a point at fromMs or later, in the order of the quantities
    // and then of their entries' keys. Of a quantity ranked by strength, eight: those heard
    // in the chart's newest two slots before the others, each group strongest first by the
    // ranking value they were last heard with; every quantity of the chart in the same order.
    [[nodiscard]] std::vector<const Series*> seriesOf(Chart chart, double fromMs) const;

    // The newest time seen in this session; nothing before the first point.
    [[nodiscard]] std::optional<double> newestMs() const { return newestMs_; }
    // Counts the times the history started over because time went backwards.
    [[nodiscard]] std::uint32_t session() const { return session_; }
    // Changes whenever a point of the chart is added, a session starts or the first time of
    // the history is seen: readers redraw only when it has.
    [[nodiscard]] std::uint64_t revision(Chart chart) const {
        return revisions_[static_cast<std::size_t>(chart)];
    }
    [[nodiscard]] std::size_t seriesCount() const { return series_.size(); }
    [[nodiscard]] const Limits& limits() const { return limits_; }

  private:
    struct KeyHash {
        std::size_t operator()(const SeriesKey& k) const noexcept {
            // Unsigned, so that large cell numbers wrap instead of overflowing.
            const auto a = static_cast<std::uint64_t>(k.a);
            const auto b = static_cast<std::uint64_t>(k.b);
            return std::hash<std::uint64_t>()((a * 1000003U + b) ^ (k.quantity * 0x9E3779B9U));
        }
    };

    [[nodiscard]] double timeOf(std::optional<double> eventTimeMs) const;
    void startSession(double timeMs);
    void raiseAllRevisions();
    // Whether a point was added.
    bool add(std::size_t quantity, const Dict& stored, double timeMs);
    void addEntry(std::size_t quantity, const Dict& entry, float value, double timeMs,
                  float rank = 0);
    Series& seriesFor(SeriesKey key);
    Series& singleFor(std::size_t quantity);

    Limits limits_;
    Clock clock_;
    std::vector<std::unique_ptr<Series>> series_;
    std::unordered_map<SeriesKey, Series*, KeyHash> index_;
    std::vector<std::vector<Series*>> ofQuantity_;  // the series made for each quantity
    std::vector<Series*> single_;  // the one series of a quantity without entries, once made
    // The quantities read from each kind, by property.
    std::vector<std::vector<std::size_t>> byProperty_;
    std::vector<std::pair<float, const Dict*>> strongest_;  // scratch for the ranking
    std::optional<double> newestMs_;
    std::uint32_t session_ = 0;
    std::array<std::uint64_t, kCharts.size()> revisions_{};
};

}  // namespace pyx
