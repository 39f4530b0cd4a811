#include "ui/qt/QtFrontEnd.h"

#include <QApplication>
#include <QDir>
#include <QMetaObject>
#include <QQmlApplicationEngine>
#include <QQuickStyle>
#include <QQuickWindow>
#include <QSGRendererInterface>
#include <QTimer>
#include <QUrl>

#include <cstdlib>
#include <string_view>
#include <utility>

#include "core/Log.h"
#include "metrics/MetricValidator.h"
#include "ui/qt/MainQueueBridge.h"
#include "ui/qt/Navigator.h"
#include "ui/qt/QmlTypes.h"
#include "ui/qt/Screenshots.h"

namespace pyx {
namespace {

bool environmentSet(const char* name) {
    const char* value = std::getenv(name);
    return value != nullptr && *value != '\0';
}

bool offscreenPlatform() {
    const char* platform = std::getenv("QT_QPA_PLATFORM");
    return platform != nullptr && std::string_view(platform).starts_with("offscreen");
}

}  // namespace

bool displayAvailable() {
    return environmentSet("DISPLAY") || environmentSet("WAYLAND_DISPLAY") || offscreenPlatform();
}

void quitWindow() {
    QCoreApplication::exit(0);
}

int runWindow(int& argc, char** argv, const WindowOptions& options,
              std::function<void()> rootViewDidLoad) {
    // Screenshots need no screen: without a display they are rendered off screen.
    if (options.screenshotDir && !displayAvailable()) qputenv("QT_QPA_PLATFORM", "offscreen");
    if (offscreenPlatform()) QQuickWindow::setGraphicsApi(QSGRendererInterface::Software);

    // A widgets application: the chart pages' Qt Charts types draw through Qt Widgets.
    const QApplication app(argc, argv);
    QApplication::setApplicationName(QStringLiteral("Pyxon"));
    QApplication::setApplicationDisplayName(QStringLiteral("Pyxon"));
    QQuickStyle::setStyle(QStringLiteral("Basic"));
    const qt::MainQueueBridge bridge;
    qt::registerQmlTypes();

    qt::Navigator navigator(MetricValidator::sharedInstance(), options.drive);
    QObject::connect(
        &navigator, &qt::Navigator::rootViewDidLoad, &navigator,
        [callback = std::move(rootViewDidLoad)] {
            if (callback) callback();
        },
        Qt::QueuedConnection);

    QQmlApplicationEngine engine;
    engine.setInitialProperties({{QStringLiteral("navigator"), QVariant::fromValue(&navigator)}});
    engine.load(QUrl(QStringLiteral("qrc:/pyxon/Main.qml")));
    if (engine.rootObjects().isEmpty()) {
        systemFault("pyxon: the window could not be loaded");
        return 1;
    }
    auto* const window = qobject_cast<QQuickWindow*>(engine.rootObjects().constFirst());
    if (window == nullptr) {
        systemFault("pyxon: the window's root is not a window");
        return 1;
    }

    std::unique_ptr<qt::Screenshots> screenshots;
    if (options.screenshotDir) {
        const QDir folder(QString::fromStdString(*options.screenshotDir));
        if (!folder.mkpath(QStringLiteral("."))) {
            systemFault("pyxon: cannot create the screenshot folder " + *options.screenshotDir);
            return 1;
        }
        screenshots = std::make_unique<qt::Screenshots>(navigator, *window, folder,
                                                        options.screenshotChartDelayMs);
        QObject::connect(screenshots.get(), &qt::Screenshots::finished, &app,
                         [](int status) { QApplication::exit(status); });
        QTimer::singleShot(options.screenshotDelayMs, screenshots.get(),
                           [&screenshots] { screenshots->start(); });
    }
    if (options.chart && !options.screenshotDir) {
        const QStringList path{QString::fromStdString(options.chart->first),
                               QString::fromStdString(options.chart->second)};
        QTimer::singleShot(0, &navigator, [&navigator, path] {
            navigator.setAnimated(false);
            if (!navigator.open(path) || !navigator.openChart())
                systemFault("pyxon: cannot open the chart of " + path.join(" / ").toStdString());
            navigator.setAnimated(true);
        });
    }
    return QApplication::exec();
}

}  // namespace pyx
