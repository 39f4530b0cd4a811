#include "ui/qt/Screenshots.h"

#include <QImage>
#include <QTimer>

#include "core/Log.h"
#include "ui/PyxViewItems.h"

namespace pyx::qt {
namespace {

// Time for the view to lay out a pushed screen before it is grabbed.
constexpr int kSettleMs = 100;

QString slug(const QString& title) {
    QString out;
    for (const QChar c : title.toLower()) out += c.isLetterOrNumber() ? c : QChar('-');
    return out;
}

}  // namespace

Screenshots::Screenshots(Navigator& navigator, QQuickWindow& window, const QDir& folder,
                         QObject* parent)
    : QObject(parent), navigator_(navigator), window_(window), folder_(folder), paths_(paths()) {}

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

QString Screenshots::fileName(int number, const QStringList& path) {
    QStringList parts{QStringLiteral("%1").arg(number, 2, 10, QChar('0'))};
    if (path.isEmpty()) parts << QStringLiteral("launch");
    for (const QString& title : path) parts << slug(title);
    return parts.join('-') + QStringLiteral(".png");
}

void Screenshots::start() {
    navigator_.setAnimated(false);
    next();
}

void Screenshots::next() {
    if (done_ == paths_.size()) {
        emit finished(0);
        return;
    }
    if (!navigator_.open(paths_[done_])) {
        systemLog("pyxon: cannot open the screen " + paths_[done_].join(" / ").toStdString());
        emit finished(1);
        return;
    }
    QTimer::singleShot(kSettleMs, this, &Screenshots::shoot);
}

void Screenshots::shoot() {
    const QString file = folder_.filePath(fileName(static_cast<int>(done_) + 1, paths_[done_]));
    const QImage image = window_.grabWindow();
    if (image.isNull() || !image.save(file, "PNG")) {
        systemLog("pyxon: cannot write the screenshot " + file.toStdString());
        emit finished(1);
        return;
    }
    ++done_;
    next();
}

}  // namespace pyx::qt
