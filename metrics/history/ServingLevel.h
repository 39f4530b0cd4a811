// The serving cell's signal level: LTE RSRP, the UMTS serving RSSI (the WCDMA measurement the
// store keeps has no RSCP), GSM idle RxLev, each read where the charts read it, and the level
// class a map colours it by. An export follows it event by event; the drive map takes it from
// the store as each fix arrives.
#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string_view>

#include "core/Value.h"
#include "metrics/MetricValidator.h"

namespace pyx {

struct ServingLevel {
    std::string_view technology;  // "LTE", "UMTS", "GSM"
    std::string_view quantity;    // "RSRP", "RSSI", "RxLev"
    double dBm = 0;
    // 0 (strongest) to 4 (weakest), from the technology's thresholds.
    int levelClass = 0;
};

// The words for each class, strongest first.
inline constexpr std::array<std::string_view, 5> kLevelClassNames = {"excellent", "good", "fair",
                                                                     "poor", "very poor"};

// Follows the serving level through the events of an export. A modem reporting several
// technologies at once (or the simulated baseband) is taken at its newest: LTE before UMTS
// before GSM among the levels heard within the last ten seconds.
class ServingLevelTracker {
  public:
    static constexpr std::int64_t kFreshNs = 10'000'000'000;

    // An event the store decoded and keeps under property (its converted dictionary), that
    // arrived at wallNs; the serving level is taken when the event carries it.
    void update(std::string_view property, const Dict& dictionary, std::int64_t wallNs);
    // The level at wallNs, if any was heard recently.
    [[nodiscard]] std::optional<ServingLevel> current(std::int64_t wallNs) const;

  private:
    struct Heard {
        ServingLevel level;
        std::int64_t wallNs = 0;
    };
    std::array<std::optional<Heard>, 3> heard_;  // by technology, LTE first
};

// The level the store shows now: LTE before UMTS before GSM, the first the store holds.
[[nodiscard]] std::optional<ServingLevel> servingLevelOf(const MetricValidator& store);

}  // namespace pyx
