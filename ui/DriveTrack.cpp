#include "ui/DriveTrack.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <ctime>
#include <limits>
#include <numbers>

#include "metrics/MetricValidator.h"

namespace pyx {
namespace {

constexpr double kEarthRadiusM = 6'371'008.8;  // mean radius

}  // namespace

DriveTrack::DriveTrack(std::shared_ptr<const MetricValidator> store) : store_(std::move(store)) {}

void DriveTrack::followGpsd(std::function<gps::GpsdState()> state, std::string address) {
    gpsdState_ = std::move(state);
    gpsdAddress_ = std::move(address);
}

void DriveTrack::addFix(const gps::Fix& fix) {
    latest_ = fix;
    addPoint(DrivePoint{fix.lat, fix.lon, store_ ? servingLevelOf(*store_) : std::nullopt});
}

void DriveTrack::addPoint(const DrivePoint& point) {
    if (points_.size() >= kCapacity) {
        // Every other point of the older half goes.
        const std::size_t half = points_.size() / 2;
        std::size_t kept = 0;
        for (std::size_t i = 0; i < half; i += 2) points_[kept++] = points_[i];
        for (std::size_t i = half; i < points_.size(); ++i) points_[kept++] = points_[i];
        points_.resize(kept);
    }
    points_.push_back(point);
    ++revision_;
}

void DriveTrack::clear() {
    points_.clear();
    latest_.reset();
    ++revision_;
}

std::string DriveTrack::statusText(std::int64_t nowNs) const {
    if (!gpsdState_) {
        if (!latest_) return "GPS off (start with --gps)";
        // A replay's fix: where the drive was then; its age says nothing now.
        const std::int64_t ns = latest_->timeNs ? latest_->timeNs : latest_->receivedNs;
        const auto seconds = static_cast<std::time_t>(ns / 1'000'000'000);
        std::tm utc{};
        gmtime_r(&seconds, &utc);
        char text[96];
        std::snprintf(text, sizeof text, "GPS recorded %s %.5f, %.5f at %02d:%02d:%02d UTC",
                      latest_->mode == gps::FixMode::ThreeD ? "3D" : "2D", latest_->lat,
                      latest_->lon, utc.tm_hour, utc.tm_min, utc.tm_sec);
        return text;
    }
    const gps::GpsdState state = gpsdState_();
    if (state == gps::GpsdState::Unreachable)
        return "GPS: gpsd not running at " + gpsdAddress_ + " (retrying)";
    if (!latest_) return "GPS: no fix yet";
    const std::int64_t ageNs = std::max<std::int64_t>(0, nowNs - latest_->receivedNs);
    const long long ageS = static_cast<long long>(ageNs / 1'000'000'000);
    if (ageNs > kStaleNs || state == gps::GpsdState::NoFix) {
        char text[64];
        std::snprintf(text, sizeof text, "GPS: fix lost %lld s ago", ageS);
        return text;
    }
    char text[96];
    std::snprintf(text, sizeof text, "GPS %s %.5f, %.5f \u00b7 %lld s ago",
                  latest_->mode == gps::FixMode::ThreeD ? "3D" : "2D", latest_->lat, latest_->lon,
                  ageS);
    return text;
}

std::vector<MapPoint> projectTrack(const std::vector<DrivePoint>& points) {
    std::vector<MapPoint> projected;
    if (points.empty()) return projected;
    double south = std::numeric_limits<double>::infinity();
    double north = -south;
    double west = south;
    double east = -south;
    for (const DrivePoint& p : points) {
        south = std::min(south, p.lat);
        north = std::max(north, p.lat);
        west = std::min(west, p.lon);
        east = std::max(east, p.lon);
    }
    const double lat0 = (south + north) / 2;
    const double lon0 = (west + east) / 2;
    const double radians = std::numbers::pi / 180;
    const double cosLat = std::cos(lat0 * radians);
    projected.reserve(points.size());
    for (const DrivePoint& p : points)
        projected.push_back(MapPoint{kEarthRadiusM * (p.lon - lon0) * radians * cosLat,
                                     kEarthRadiusM * (p.lat - lat0) * radians});
    return projected;
}

double scaleBarMetres(double spanMetres) {
    const double most = std::max(spanMetres / 4, 1.0);
    const double power = std::pow(10.0, std::floor(std::log10(most)));
    for (const double step : {5.0, 2.0, 1.0})
        if (step * power <= most) return step * power;
    return power;
}

std::string distanceText(double metres) {
    char text[32];
    if (metres >= 1000)
        std::snprintf(text, sizeof text, "%g km", metres / 1000);
    else
        std::snprintf(text, sizeof text, "%g m", metres);
    return text;
}

}  // namespace pyx
