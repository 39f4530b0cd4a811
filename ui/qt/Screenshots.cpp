#include "ui/qt/Screenshots.h"

#include <QImage>
#include <QTimer>

#include "core/Log.h"
#include "ui/ChartScreens.h"
#include "ui/PyxViewItems.h"

namespace pyx::qt {
namespace {

// Time for the view to lay out a pushed screen before it is grabbed.
constexpr int kSettleMs = 100;
// A chart page draws its panels once laid out: a little longer.
constexpr int kChartSettleMs = 400;

QString slug(const QString& title) {
    QString out;
    for (const QChar c : title.toLower()) out += c.isLetterOrNumber() ? c : QChar('-');
    return out;
}

}  // namespace

Screenshots::Screenshots(Navigator& navigator, QQuickWindow& window, const QDir& folder,
                         int chartDelayMs, QObject* parent)
    : QObject(parent),
      navigator_(navigator),
      window_(window),
      folder_(folder),
      paths_(paths()),
      chartDelayMs_(chartDelayMs),
      charts_(chartIndexes(paths_)) {}

std::vector<QStringList> Screenshots::paths() {
    const PyxViewItems& items = sharedPyxViewItems();
    std::vector<QStringList> out{QStringList{}};
    for (const std::string& group : items.launchViewItemNames)
        out.push_back({QString::fromStdString(group)});
    for (const std::string& group : items.launchViewItemNames)
        for (const std::string& category : items.firstLevelViewItems.at(group))
            out.push_back({QString::fromStdString(group), QString::fromStdString(category)});
    return out;
}

std::vector<std::size_t> Screenshots::chartIndexes(const std::vector<QStringList>& paths) {
    std::vector<std::size_t> out;
    for (std::size_t i = 0; i < paths.size(); ++i)
        if (paths[i].size() == 2 && chartForCategory(paths[i].join(' ').toStdString()))
            out.push_back(i);
    return out;
}

std::vector<int> Screenshots::chartNumbers() {
    std::vector<int> out;
    for (const std::size_t i : chartIndexes(paths())) out.push_back(static_cast<int>(i) + 1);
    return out;
}

QString Screenshots::fileName(int number, const QStringList& path, bool chart) {
    QStringList parts{QStringLiteral("%1").arg(number, 2, 10, QChar('0'))};
    if (path.isEmpty()) parts << QStringLiteral("launch");
    for (const QString& title : path) parts << slug(title);
    if (chart) parts << QStringLiteral("chart");
    return parts.join('-') + QStringLiteral(".png");
}

void Screenshots::start() {
    navigator_.setAnimated(false);
    next();
}

void Screenshots::next() {
    if (done_ == paths_.size()) {
        // The charts come last, after a pause in which the history grows.
        inCharts_ = true;
        if (charts_.empty() || !navigator_.chartsOffered()) {
            nextMap();
            return;
        }
        QTimer::singleShot(chartDelayMs_, this, &Screenshots::nextChart);
        return;
    }
    if (!navigator_.open(paths_[done_])) {
        systemFault("pyxon: cannot open the screen " + paths_[done_].join(" / ").toStdString());
        emit finished(1);
        return;
    }
    QTimer::singleShot(kSettleMs, this, &Screenshots::shoot);
}

void Screenshots::nextChart() {
    if (chartsDone_ == charts_.size()) {
        nextMap();
        return;
    }
    const QStringList& path = paths_[charts_[chartsDone_]];
    if (!navigator_.open(path) || !navigator_.openChart()) {
        systemFault("pyxon: cannot open the chart of " + path.join(" / ").toStdString());
        emit finished(1);
        return;
    }
    QTimer::singleShot(kChartSettleMs, this, &Screenshots::shoot);
}

void Screenshots::nextMap() {
    if (mapDone_ || !navigator_.mapOffered()) {
        emit finished(0);
        return;
    }
    navigator_.popToRoot();
    if (!navigator_.openDriveMap()) {
        systemFault("pyxon: cannot open the Drive map");
        emit finished(1);
        return;
    }
    inMap_ = true;
    QTimer::singleShot(kChartSettleMs, this, &Screenshots::shoot);
}

QString Screenshots::mapFileName() {
    return QStringLiteral("%1-drive-map.png")
        .arg(static_cast<int>(paths().size()) + 1, 2, 10, QChar('0'));
}

void Screenshots::shoot() {
    if (inMap_) {
        if (!save(folder_.filePath(mapFileName()))) return;
        mapDone_ = true;
        emit finished(0);
        return;
    }
    if (inCharts_) {
        const std::size_t index = charts_[chartsDone_];
        if (!save(folder_.filePath(fileName(static_cast<int>(index) + 1, paths_[index], true))))
            return;
        ++chartsDone_;
        nextChart();
        return;
    }
    if (!save(folder_.filePath(fileName(static_cast<int>(done_) + 1, paths_[done_])))) return;
    ++done_;
    next();
}

bool Screenshots::save(const QString& file) {
    const QImage image = window_.grabWindow();
    if (image.isNull() || !image.save(file, "PNG")) {
        systemFault("pyxon: cannot write the screenshot " + file.toStdString());
        emit finished(1);
        return false;
    }
    return true;
}

}  // namespace pyx::qt
