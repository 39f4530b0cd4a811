// Qt Quick Test runner for the window's QML: a navigator over a store of its own (as
// "testNavigator") and a way to put metrics into that store (as "testStore").
#include <QObject>
#include <QQmlContext>
#include <QQmlEngine>
#include <QQuickWindow>
#include <QSGRendererInterface>
#include <QVariantMap>
#include <QtQuickTest>

#include <memory>

#include "metrics/MetricValidator.h"
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
    // key order: ["key", value, "key", value, ...].
    Q_INVOKABLE bool setDictionary(const QString& property, const QVariantList& fields) {
        const auto p = pyx::MetricValidator::dictionaryPropertyNamed(property.toStdString());
        if (!p || fields.size() % 2 != 0) return false;
        pyx::Dict dict;
        for (qsizetype i = 0; i < fields.size(); i += 2) {
            const QVariant& value = fields.at(i + 1);
            const std::string key = fields.at(i).toString().toStdString();
            if (value.typeId() == QMetaType::QString)
                dict.set(key, pyx::Value(value.toString().toStdString()));
            else
                dict.set(key, pyx::Value(static_cast<std::int64_t>(value.toLongLong())));
        }
        store_->setDictionary(*p, std::move(dict));
        return true;
    }
    Q_INVOKABLE void clear(const QString& property) {
        if (const auto p = pyx::MetricValidator::dictionaryPropertyNamed(property.toStdString()))
            store_->setDictionary(*p, std::nullopt);
    }

  private:
    std::shared_ptr<pyx::MetricValidator> store_;
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
        auto navigator = std::make_unique<pyx::qt::Navigator>(store);
        auto testStore = std::make_unique<TestStore>(store);
        engine->rootContext()->setContextProperty("testNavigator", navigator.get());
        engine->rootContext()->setContextProperty("testStore", testStore.get());
        navigators_.push_back(std::move(navigator));
        stores_.push_back(std::move(testStore));
    }
    void cleanupTestCase() {
        navigators_.clear();
        stores_.clear();
        bridge_.reset();
    }

  private:
    std::unique_ptr<pyx::qt::MainQueueBridge> bridge_;
    std::vector<std::unique_ptr<pyx::qt::Navigator>> navigators_;
    std::vector<std::unique_ptr<TestStore>> stores_;
};

}  // namespace

QUICK_TEST_MAIN_WITH_SETUP(ui_quick_tests, Setup)

#include "QuickTestMain.moc"
