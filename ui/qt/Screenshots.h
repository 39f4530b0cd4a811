// Renders every screen of the menu to PNG files: the launch list, each group's menu, then the
// category screen of every menu pair, navigating the way a user would.
#pragma once

#include <QDir>
#include <QObject>
#include <QQuickWindow>
#include <QString>
#include <QStringList>

#include <vector>

#include "ui/qt/Navigator.h"

namespace pyx::qt {

class Screenshots : public QObject {
    Q_OBJECT

  public:
    // The file names follow the order of the shots: "01-launch.png", "02-device-info.png",
    // ..., "06-device-info-imsi.png", ...
    Screenshots(Navigator& navigator, QQuickWindow& window, const QDir& folder,
                QObject* parent = nullptr);

    // Takes the shots one by one from the event loop; emits finished with 0, or with 1 after
    // printing why a shot could not be taken or saved.
    void start();

    // Every path to shoot, in order: {}, {group}, then {group, category}.
    [[nodiscard]] static std::vector<QStringList> paths();
    [[nodiscard]] static QString fileName(int number, const QStringList& path);

  signals:
    void finished(int status);

  private:
    void next();
    void shoot();

    Navigator& navigator_;
    QQuickWindow& window_;
    QDir folder_;
    std::vector<QStringList> paths_;
    std::size_t done_ = 0;
};

}  // namespace pyx::qt
