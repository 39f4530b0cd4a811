// Renders every screen of the menu to PNG files: the launch list, each group's menu, then the
// category screen of every menu pair, navigating the way a user would; then, after a pause
// that lets the history grow, the chart page of every category screen that has one, and last
// the Drive map page.
#pragma once

#include <QDir>
#include <QObject>
#include <QQuickWindow>
#include <QString>
#include <QStringList>

#include <cstddef>
#include <vector>

#include "ui/qt/Navigator.h"

namespace pyx::qt {

class Screenshots : public QObject {
    Q_OBJECT

  public:
    // The file names follow the order of the shots: "01-launch.png", "02-device-info.png",
    // ..., "06-device-info-imsi.png", ...
    // chartDelayMs: the pause before the chart pages, taken only when the navigator offers
    // charts.
    Screenshots(Navigator& navigator, QQuickWindow& window, const QDir& folder,
                int chartDelayMs = 5000, QObject* parent = nullptr);

    // Takes the shots one by one from the event loop; emits finished with 0, or with 1 after
    // printing why a shot could not be taken or saved.
    void start();

    // Every path to shoot, in order: {}, {group}, then {group, category}.
    [[nodiscard]] static std::vector<QStringList> paths();
    // The numbers (from 1, as in fileName) of the paths whose screen has a chart page.
    [[nodiscard]] static std::vector<int> chartNumbers();
    // "12-lte-serving-cell-meas.png", or with chart "12-lte-serving-cell-meas-chart.png".
    [[nodiscard]] static QString fileName(int number, const QStringList& path, bool chart = false);
    // The Drive map's shot, numbered after the screens: "44-drive-map.png".
    [[nodiscard]] static QString mapFileName();

  signals:
    void finished(int status);

  private:
    // The indexes into paths of the paths whose screen has a chart page.
    [[nodiscard]] static std::vector<std::size_t> chartIndexes(
        const std::vector<QStringList>& paths);

    void next();
    void nextChart();
    void nextMap();
    void shoot();
    // Grabs the window into file; false (after finishing with 1) when it cannot.
    bool save(const QString& file);

    Navigator& navigator_;
    QQuickWindow& window_;
    QDir folder_;
    std::vector<QStringList> paths_;
    std::size_t done_ = 0;
    int chartDelayMs_;
    std::vector<std::size_t> charts_;  // into paths_
    std::size_t chartsDone_ = 0;
    bool inCharts_ = false;
    bool inMap_ = false;
    bool mapDone_ = false;
};

}  // namespace pyx::qt
