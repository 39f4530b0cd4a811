// The Drive map page's contents for Qt Quick: the track's points in metres east and north of
// its centre, one scatter series per level class (and one for points without a level), a
// square extent so that a metre is as long across as up, a scale bar and the legend. The page
// asks it to refresh once a second while shown; it reads the track only when a point was added.
#pragma once

#include <QList>
#include <QObject>
#include <QPointF>
#include <QString>

#include <cstdint>
#include <memory>

#include "ui/DriveTrack.h"

namespace pyx::qt {

class DriveMapModel : public QObject {
    Q_OBJECT
    Q_PROPERTY(bool empty READ empty NOTIFY changed)
    Q_PROPERTY(QString emptyText READ emptyText NOTIFY changed)
    Q_PROPERTY(int pointCount READ pointCount NOTIFY changed)
    Q_PROPERTY(double extent READ extent NOTIFY changed)
    Q_PROPERTY(double scaleMetres READ scaleMetres NOTIFY changed)
    Q_PROPERTY(QString scaleText READ scaleText NOTIFY changed)
    Q_PROPERTY(QString technology READ technology NOTIFY changed)

  public:
    // The bins: the level classes, strongest first, then "no level".
    static constexpr int kBins = 6;

    explicit DriveMapModel(std::shared_ptr<const DriveTrack> track, QObject* parent = nullptr);

    [[nodiscard]] bool empty() const { return pointCount() == 0; }
    [[nodiscard]] QString emptyText() const;
    [[nodiscard]] int pointCount() const;
    // Half the side of the square shown, in metres.
    [[nodiscard]] double extent() const { return extent_; }
    [[nodiscard]] double scaleMetres() const { return scaleMetres_; }
    [[nodiscard]] QString scaleText() const;
    // What the levels are of: "LTE RSRP", "UMTS RSSI", "GSM RxLev" (the newest point's).
    [[nodiscard]] QString technology() const { return technology_; }

    Q_INVOKABLE int binCount() const { return kBins; }
    // "excellent (≥ −80 dBm)" ... "no level"; the legend's words.
    Q_INVOKABLE QString binName(int bin) const;
    Q_INVOKABLE QString binColor(int bin) const;
    Q_INVOKABLE int binSize(int bin) const;
    Q_INVOKABLE QList<QPointF> points(int bin) const;
    // Puts the bin's points into a scatter series (replacing its points).
    Q_INVOKABLE void fill(int bin, QObject* series) const;

    // Reads the track again when it changed, and emits changed.
    Q_INVOKABLE void refresh();

  signals:
    void changed();

  private:
    void rebuild();

    std::shared_ptr<const DriveTrack> track_;
    std::uint64_t readRevision_ = ~std::uint64_t{0};
    QList<QPointF> bins_[kBins];
    double extent_ = 0;
    double scaleMetres_ = 0;
    QString technology_;
};

}  // namespace pyx::qt
