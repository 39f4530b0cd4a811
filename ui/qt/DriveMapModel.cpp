#include "ui/qt/DriveMapModel.h"

#include <QXYSeries>

#include <algorithm>
#include <array>
#include <cmath>

namespace pyx::qt {
namespace {

// Green to red, then grey for points without a level.
constexpr std::array<const char*, DriveMapModel::kBins> kColors = {"#1a9850", "#91cf60", "#fee08b",
                                                                   "#fc8d59", "#d73027", "#9e9e9e"};

}  // namespace

DriveMapModel::DriveMapModel(std::shared_ptr<const DriveTrack> track, QObject* parent)
    : QObject(parent), track_(std::move(track)) {
    rebuild();
}

QString DriveMapModel::emptyText() const {
    if (!empty()) return {};
    if (!track_->gpsOn())
        return QStringLiteral(
            "No positions: start Pyxon with --gps to map the drive (gpsd on this machine), "
            "or --gps HOST:PORT.");
    return QStringLiteral("No position yet. The map starts with the first GPS fix.");
}

int DriveMapModel::pointCount() const {
    int count = 0;
    for (const auto& bin : bins_) count += static_cast<int>(bin.size());
    return count;
}

QString DriveMapModel::scaleText() const {
    return QString::fromStdString(distanceText(scaleMetres_));
}

QString DriveMapModel::binName(int bin) const {
    if (bin < 0 || bin >= kBins) return {};
    if (bin == kBins - 1) return QStringLiteral("no level");
    return QString::fromUtf8(
        kLevelClassNames[static_cast<std::size_t>(bin)].data(),
        static_cast<qsizetype>(kLevelClassNames[static_cast<std::size_t>(bin)].size()));
}

QString DriveMapModel::binColor(int bin) const {
    return bin >= 0 && bin < kBins ? QString::fromLatin1(kColors[static_cast<std::size_t>(bin)])
                                   : QString();
}

int DriveMapModel::binSize(int bin) const {
    return bin >= 0 && bin < kBins ? static_cast<int>(bins_[bin].size()) : 0;
}

QList<QPointF> DriveMapModel::points(int bin) const {
    return bin >= 0 && bin < kBins ? bins_[bin] : QList<QPointF>();
}

void DriveMapModel::fill(int bin, QObject* series) const {
    if (auto* const scatter = qobject_cast<QXYSeries*>(series)) scatter->replace(points(bin));
}

void DriveMapModel::refresh() {
    if (track_->revision() == readRevision_) return;
    rebuild();
    emit changed();
}

void DriveMapModel::rebuild() {
    readRevision_ = track_->revision();
    for (auto& bin : bins_) bin.clear();
    const auto& points = track_->points();
    const auto projected = projectTrack(points);
    double reach = 0;
    for (std::size_t i = 0; i < points.size(); ++i) {
        const DrivePoint& p = points[i];
        const int bin = p.level ? std::clamp(p.level->levelClass, 0, kBins - 2) : kBins - 1;
        bins_[bin].append(QPointF(projected[i].east, projected[i].north));
        reach = std::max({reach, std::abs(projected[i].east), std::abs(projected[i].north)});
    }
    // A little room around the track, and at least 100 m across.
    extent_ = std::max(reach * 1.1, 50.0);
    scaleMetres_ = scaleBarMetres(2 * extent_);
    technology_.clear();
    if (!points.empty() && points.back().level) {
        const ServingLevel& level = *points.back().level;
        technology_ =
            QString::fromUtf8(level.technology.data(),
                              static_cast<qsizetype>(level.technology.size())) +
            ' ' +
            QString::fromUtf8(level.quantity.data(), static_cast<qsizetype>(level.quantity.size()));
    }
}

}  // namespace pyx::qt
