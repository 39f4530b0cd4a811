// One position report from the GPS receiver (gpsd's TPV), as the rest of Pyxon sees it.
#pragma once

#include <cstdint>
#include <optional>

namespace pyx::gps {

// gpsd's TPV mode.
enum class FixMode : std::uint8_t { Unknown = 0, NoFix = 1, TwoD = 2, ThreeD = 3 };

struct Fix {
    std::int64_t timeNs = 0;      // the fix's own time (UTC), ns since 1970
    std::int64_t receivedNs = 0;  // wall clock when it reached us, ns since 1970
    FixMode mode = FixMode::NoFix;
    double lat = 0.0;                        // degrees, WGS 84
    double lon = 0.0;                        // degrees, WGS 84
    std::optional<double> altM;              // metres above mean sea level
    std::optional<double> speedMps;          // metres per second over ground
    std::optional<double> trackDeg;          // degrees from true north
    std::optional<double> horizontalErrorM;  // estimated horizontal error (eph), metres

    friend bool operator==(const Fix&, const Fix&) = default;
};

}  // namespace pyx::gps
