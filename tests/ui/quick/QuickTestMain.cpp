// Qt Quick Test runner for the window's QML: a navigator over a store of its own (as
// "testNavigator") and a way to put metrics into that store and its history (as
// "testStore"), and a drive track for the Drive map page ("testDrive"). A widgets application,
// as the window's: the chart pages need one.
#include <QApplication>
#include <QObject>
#include <QQmlContext>
#include <QQmlEngine>
#include <QQuickWindow>
#include <QSGRendererInterface>
#include <QVariantMap>
#include <QtQuickTest>

#include <memory>

#include "metrics/MetricValidator.h"
#include "metrics/history/History.h"
#include "ui/DriveTrack.h"
#include "ui/qt/MainQueueBridge.h"
#include "ui/qt/Navigator.h"
#include "ui/qt/QmlTypes.h"

namespace {

// Sets and clears the store's dictionaries from QML.
class TestStore : public QObject {
    Q_OBJECT

  public:
    explicit TestStore(std::shared_ptr<pyx::MetricValidator> store) : store_(std::move(store)) {}

    // property: a dictionary property's name ("myLTECDRXConfigDict"); fields in the given
    // key order: ["key", value, "key", value, ...], where a value that is a list holds entries
    // given the same way.
    Q_INVOKABLE bool setDictionary(const QString& property, const QVariantList& fields) {
        const auto p = pyx::MetricValidator::dictionaryPropertyNamed(property.toStdString());
        if (!p || fields.size() % 2 != 0) return false;
        store_->setDictionary(*p, dictionaryOf(fields));
        return true;
    }
    // One arrival of that dictionary at timeMs (ms since 1970), for the history.
    Q_INVOKABLE bool record(const QString& property, const QVariantList& fields, double timeMs) {
        const auto p = pyx::MetricValidator::dictionaryPropertyNamed(property.toStdString());
        if (!p || fields.size() % 2 != 0 || !store_->history()) return false;
        store_->history()->record(*p, dictionaryOf(fields), timeMs);
        return true;
    }
    // Starts the history afresh (chart pages opened later read the new one).
    Q_INVOKABLE void clearHistory() { store_->setHistory(std::make_shared<pyx::History>()); }
    Q_INVOKABLE void clear(const QString& property) {
        if (const auto p = pyx::MetricValidator::dictionaryPropertyNamed(property.toStdString()))
            store_->setDictionary(*p, std::nullopt);
    }

  private:
    static pyx::Dict dictionaryOf(const QVariantList& fields) {
        pyx::Dict dict;
        for (qsizetype i = 0; i + 1 < fields.size(); i += 2) {
            const QVariant& value = fields.at(i + 1);
            const std::string key = fields.at(i).toString().toStdString();
            if (value.typeId() == QMetaType::QString) {
                dict.set(key, pyx::Value(value.toString().toStdString()));
            } else if (value.typeId() == QMetaType::QVariantList) {
                // A list of entries, each given as its own [key, value, ...] list.
                pyx::Array entries;
                for (const QVariant& entry : value.toList())
                    entries.emplace_back(dictionaryOf(entry.toList()));
                dict.set(key, pyx::Value(std::move(entries)));
            } else {
                dict.set(key, pyx::Value(static_cast<std::int64_t>(value.toLongLong())));
            }
        }
        return dict;
    }

    std::shared_ptr<pyx::MetricValidator> store_;
};

// Puts points on the drive track from QML.
class TestDrive : public QObject {
    Q_OBJECT

  public:
    explicit TestDrive(std::shared_ptr<pyx::DriveTrack> track) : track_(std::move(track)) {}

    // levelClass: 0 (excellent) to 4 (very poor) of an LTE RSRP of dBm; -1: no level.
    Q_INVOKABLE void addPoint(double lat, double lon, int levelClass, double dBm) {
        pyx::DrivePoint point{lat, lon, std::nullopt};
        if (levelClass >= 0) point.level = pyx::ServingLevel{"LTE", "RSRP", dBm, levelClass};
        track_->addPoint(point);
    }
    Q_INVOKABLE void clear() { track_->clear(); }

  private:
    std::shared_ptr<pyx::DriveTrack> track_;
};

class Setup : public QObject {
    Q_OBJECT

  public slots:
    void applicationAvailable() {
        QQuickWindow::setGraphicsApi(QSGRendererInterface::Software);
        bridge_ = std::make_unique<pyx::qt::MainQueueBridge>();
        pyx::qt::registerQmlTypes();
    }
    void qmlEngineAvailable(QQmlEngine* engine) {
        auto store = pyx::MetricValidator::create(nullptr);
        store->setHistory(std::make_shared<pyx::History>());
        auto track = std::make_shared<pyx::DriveTrack>(store);
        auto navigator = std::make_unique<pyx::qt::Navigator>(store, track);
        auto testStore = std::make_unique<TestStore>(store);
        auto testDrive = std::make_unique<TestDrive>(track);
        engine->rootContext()->setContextProperty("testNavigator", navigator.get());
        engine->rootContext()->setContextProperty("testStore", testStore.get());
        engine->rootContext()->setContextProperty("testDrive", testDrive.get());
        navigators_.push_back(std::move(navigator));
        stores_.push_back(std::move(testStore));
        drives_.push_back(std::move(testDrive));
    }
    void cleanupTestCase() {
        navigators_.clear();
        stores_.clear();
        drives_.clear();
        bridge_.reset();
    }

  private:
    std::unique_ptr<pyx::qt::MainQueueBridge> bridge_;
    std::vector<std::unique_ptr<pyx::qt::Navigator>> navigators_;
    std::vector<std::unique_ptr<TestStore>> stores_;
    std::vector<std::unique_ptr<TestDrive>> drives_;
};

}  // namespace

int main(int argc, char** argv) {
    QQuickWindow::setGraphicsApi(QSGRendererInterface::Software);
    const QApplication app(argc, argv);
    Setup setup;
    return quick_test_main_with_setup(argc, argv, "ui_quick_tests", nullptr, &setup);
}

#include "QuickTestMain.moc"
