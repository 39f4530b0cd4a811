// Where the drive went and how strong the serving cell was there: one point per GPS fix, with
// the serving level the store showed as the fix arrived. The Drive map page draws it and the
// window's status line says what the receiver gives. Like the store, it belongs to the main
// thread.
//
// Memory stays flat however long the drive: past kCapacity points, every other point of the
// older half is dropped (the track keeps its shape, older parts at half the density).
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "gps/Fix.h"
#include "gps/GpsdClient.h"
#include "metrics/history/ServingLevel.h"

namespace pyx {

class MetricValidator;

struct DrivePoint {
    double lat = 0;
    double lon = 0;
    std::optional<ServingLevel> level;
};

// A point in metres east and north of a centre, on a local equirectangular projection (exact
// enough over the tens of kilometres a drive map shows; no tiles, no network).
struct MapPoint {
    double east = 0;
    double north = 0;
};

class DriveTrack {
  public:
    static constexpr std::size_t kCapacity = 20'000;
    // A fix older than this is stale: the receiver stopped giving positions.
    static constexpr std::int64_t kStaleNs = 2'000'000'000;

    // store: where the serving level of each fix is read (none: points without a level).
    explicit DriveTrack(std::shared_ptr<const MetricValidator> store = {});

    // Where the serving level of each later fix is read.
    void setStore(std::shared_ptr<const MetricValidator> store) { store_ = std::move(store); }
    // The gpsd client's state, and its address for the status line (a run with --gps).
    void followGpsd(std::function<gps::GpsdState()> state, std::string address);
    // Whether there is a receiver to speak of: gpsd followed, or fixes handed on by a replay.
    [[nodiscard]] bool gpsOn() const { return static_cast<bool>(gpsdState_) || latest_; }

    void addFix(const gps::Fix& fix);
    void addPoint(const DrivePoint& point);
    void clear();

    [[nodiscard]] const std::vector<DrivePoint>& points() const { return points_; }
    // Changes with every point added or dropped.
    [[nodiscard]] std::uint64_t revision() const { return revision_; }

    // "GPS 3D 48.85660, 2.35220 · 1 s ago", "GPS: no fix yet", "GPS: gpsd not running at
    // 127.0.0.1:2947 (retrying)", "GPS: fix lost 12 s ago"; without gpsd, the fixes a replay
    // hands on: "GPS recorded 3D 48.85660, 2.35220 at 12:00:05 UTC". nowNs: wall clock, ns
    // since 1970.
    [[nodiscard]] std::string statusText(std::int64_t nowNs) const;

  private:
    std::shared_ptr<const MetricValidator> store_;
    std::function<gps::GpsdState()> gpsdState_;
    std::string gpsdAddress_;
    std::vector<DrivePoint> points_;
    std::optional<gps::Fix> latest_;
    std::uint64_t revision_ = 0;
};

// The points projected around the centre of their bounding box.
[[nodiscard]] std::vector<MapPoint> projectTrack(const std::vector<DrivePoint>& points);

// The length of a scale bar for a map spanning spanMetres: the largest round length (1, 2 or
// 5 times a power of ten metres) no longer than a quarter of the span.
[[nodiscard]] double scaleBarMetres(double spanMetres);
// "500 m", "2 km".
[[nodiscard]] std::string distanceText(double metres);

}  // namespace pyx
