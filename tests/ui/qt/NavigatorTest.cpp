// The navigation behind the window: what each tap pushes, what it hands forward, the refresh
// through the main queue, and the screenshot plan.
#include <QCoreApplication>
#include <QPointer>
#include <QSignalSpy>

#include <gtest/gtest.h>

#include <cstdlib>
#include <set>
#include <string>
#include <thread>

#include "../StoreFeed.h"
#include "core/MainQueue.h"
#include "metrics/history/History.h"
#include "ui/FirstLevelViewController.h"
#include "ui/SecondLevelViewController.h"
#include "ui/ThirdLevelViewController.h"
#include "ui/qt/MainQueueBridge.h"
#include "ui/qt/Navigator.h"
#include "ui/qt/QtFrontEnd.h"
#include "ui/qt/Screenshots.h"

namespace pyx::qt {
namespace {

class NavigatorTest : public ::testing::Test {
  protected:
    std::shared_ptr<MetricValidator> store = test::emptyStore();
    Navigator navigator{store};

    QString text(int level, int index) const {
        return navigator.screenAt(level)
            ->model()
            ->data(navigator.screenAt(level)->model()->index(index), TableModel::TextRole)
            .toString();
    }
};

TEST_F(NavigatorTest, StartsOnTheLaunchList) {
    EXPECT_EQ(navigator.depth(), 1);
    Screen* launch = navigator.current();
    EXPECT_EQ(launch->title(), "Pyxon");
    EXPECT_FALSE(launch->refreshes());
    EXPECT_TRUE(launch->leadsFurther());
    ASSERT_EQ(launch->model()->count(), 4);
    EXPECT_EQ(text(0, 0), "Device Info");
    EXPECT_EQ(text(0, 3), "GSM");
    EXPECT_EQ(navigator.screenAt(1), nullptr);
}

TEST_F(NavigatorTest, TappingAGroupPushesItsMenuTitledByTheGroup) {
    QSignalSpy pushed(&navigator, &Navigator::pushed);
    ASSERT_TRUE(navigator.select(1));
    EXPECT_EQ(navigator.depth(), 2);
    ASSERT_EQ(pushed.count(), 1);
    Screen* menu = navigator.current();
    EXPECT_EQ(pushed.at(0).at(0).value<Screen*>(), menu);
    EXPECT_EQ(menu->title(), "LTE");
    EXPECT_TRUE(menu->leadsFurther());
    EXPECT_FALSE(menu->refreshes());
    EXPECT_EQ(menu->model()->count(), 14);
    const auto& controller = dynamic_cast<FirstLevelViewController&>(menu->controller());
    EXPECT_EQ(controller.seguedThroughRow(), "LTE");
    EXPECT_EQ(&controller.myMetricValidator(), store.get());
}

TEST_F(NavigatorTest, UmtsThenTxPowerOpensTheCategoryScreenWithThatPair) {
    ASSERT_TRUE(navigator.open({"UMTS", "Tx Power"}));
    EXPECT_EQ(navigator.depth(), 3);
    Screen* screen = navigator.current();
    EXPECT_EQ(screen->title(), "Tx Power");
    EXPECT_TRUE(screen->refreshes());
    // Its rows open the placeholder, but they are entries, not menu items: no chevron.
    EXPECT_FALSE(screen->leadsFurther());
    const auto& controller = dynamic_cast<SecondLevelViewController&>(screen->controller());
    EXPECT_EQ(controller.firstSelection(), "UMTS");
    EXPECT_EQ(controller.seguedThroughRow(), "Tx Power");
    EXPECT_EQ(&controller.myMetricValidator(), store.get());
}

TEST_F(NavigatorTest, OpeningAnUnknownTitleStopsThere) {
    EXPECT_FALSE(navigator.open({"LTE", "Paging"}));
    EXPECT_EQ(navigator.depth(), 2);
    EXPECT_FALSE(navigator.open({"CDMA"}));
    EXPECT_EQ(navigator.depth(), 1);
}

TEST_F(NavigatorTest, TappingACategoryRowOpensTheThirdLevelPlaceholder) {
    store->setMyLTERRCStateDict(Dict{{"rrc_state", Value("CONNECTED")}});
    ASSERT_TRUE(navigator.open({"LTE", "RRC State"}));
    ASSERT_TRUE(navigator.select(0));
    EXPECT_EQ(navigator.depth(), 4);
    Screen* details = navigator.current();
    EXPECT_EQ(details->title(), "rrc_state");
    EXPECT_FALSE(details->refreshes());
    EXPECT_FALSE(details->leadsFurther());
    ASSERT_EQ(details->model()->count(), 1);
    EXPECT_FALSE(
        details->model()->data(details->model()->index(0), TableModel::TextRole).isValid());
    const auto& controller = dynamic_cast<ThirdLevelViewController&>(details->controller());
    // The category screen passes nothing on to the placeholder.
    EXPECT_FALSE(controller.firstSelection().has_value());
    EXPECT_FALSE(controller.seguedThroughRow().has_value());
    EXPECT_FALSE(controller.secondSelection().has_value());
    EXPECT_FALSE(navigator.select(0));
    EXPECT_EQ(navigator.depth(), 4);
}

TEST_F(NavigatorTest, BlankCategoryRowOpensAPlaceholderTitledByTheCategory) {
    ASSERT_TRUE(navigator.open({"LTE", "C-DRX"}));
    ASSERT_TRUE(navigator.select(0));
    EXPECT_EQ(navigator.current()->title(), "C-DRX");
}

TEST_F(NavigatorTest, HeadersAndIndexesOutOfRangeOpenNothing) {
    test::feedActiveBearers(*store, 2);
    ASSERT_TRUE(navigator.open({"LTE", "Active Bearers"}));
    EXPECT_FALSE(navigator.select(0));  // "PDP 0"
    EXPECT_FALSE(navigator.select(-1));
    EXPECT_FALSE(navigator.select(1000));
    EXPECT_EQ(navigator.depth(), 3);
}

TEST_F(NavigatorTest, BackPopsUntilTheLaunchList) {
    ASSERT_TRUE(navigator.open({"GSM", "NAS MM"}));
    QSignalSpy popped(&navigator, &Navigator::popped);
    EXPECT_TRUE(navigator.back());
    EXPECT_EQ(navigator.current()->title(), "GSM");
    EXPECT_TRUE(navigator.back());
    EXPECT_FALSE(navigator.back());
    EXPECT_EQ(navigator.depth(), 1);
    EXPECT_EQ(popped.count(), 2);
}

TEST_F(NavigatorTest, PoppedScreensLiveUntilTheViewReleasesThem) {
    ASSERT_TRUE(navigator.open({"LTE"}));
    const QPointer<Screen> menu = navigator.current();
    navigator.back();
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    ASSERT_FALSE(menu.isNull());
    navigator.release(navigator.screenAt(0));  // not popped: kept
    navigator.release(menu);
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    EXPECT_TRUE(menu.isNull());
    EXPECT_EQ(navigator.depth(), 1);
}

TEST_F(NavigatorTest, RootViewDidLoadIsAnnouncedOnce) {
    QSignalSpy loaded(&navigator, &Navigator::rootViewDidLoad);
    navigator.rootViewLoaded();
    navigator.rootViewLoaded();
    EXPECT_EQ(loaded.count(), 1);
}

TEST_F(NavigatorTest, RefreshIntervalIsFiveSecondsUnlessChanged) {
    EXPECT_EQ(navigator.refreshIntervalMs(), 5000);
    navigator.setRefreshIntervalMs(50);
    EXPECT_EQ(navigator.refreshIntervalMs(), 50);
    navigator.setRefreshIntervalMs(0);
    EXPECT_EQ(navigator.refreshIntervalMs(), 50);
}

TEST_F(NavigatorTest, UpdateReloadsTheCategoryScreenThroughTheMainQueue) {
    const MainQueueBridge bridge;
    ASSERT_TRUE(navigator.open({"LTE", "C-DRX"}));
    Screen* screen = navigator.current();
    EXPECT_EQ(screen->model()->count(), 1);
    test::feedLteCdrx(*store);
    screen->update();
    EXPECT_EQ(screen->model()->count(), 1);  // not before the main queue runs
    QCoreApplication::sendPostedEvents();
    EXPECT_EQ(screen->model()->count(), 3);
    EXPECT_EQ(screen->model()->data(screen->model()->index(0), TableModel::TextRole), "timestamp");
}

TEST_F(NavigatorTest, UpdateOfAScreenGoneBeforeTheQueueRunsDoesNothing) {
    const MainQueueBridge bridge;
    ASSERT_TRUE(navigator.open({"LTE", "C-DRX"}));
    navigator.current()->update();
    Screen* screen = navigator.current();
    navigator.back();
    navigator.release(screen);
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    QCoreApplication::sendPostedEvents();
    EXPECT_EQ(MainQueue::shared().pending(), 0U);
}

TEST(MainQueueBridgeTest, PostsFromAnyThreadRunOnTheGuiThread) {
    const MainQueueBridge bridge;
    std::thread::id ranOn;
    std::thread poster(
        [&ranOn] { MainQueue::shared().post([&ranOn] { ranOn = std::this_thread::get_id(); }); });
    poster.join();
    EXPECT_EQ(ranOn, std::thread::id());
    QCoreApplication::sendPostedEvents();
    EXPECT_EQ(ranOn, std::this_thread::get_id());
    EXPECT_TRUE(MainQueue::shared().isCurrent());
}

TEST(MainQueueBridgeTest, AfterTheBridgeIsGonePostsWaitInTheQueue) {
    { const MainQueueBridge bridge; }
    bool ran = false;
    MainQueue::shared().post([&ran] { ran = true; });
    QCoreApplication::sendPostedEvents();
    EXPECT_FALSE(ran);
    {
        const MainQueueBridge bridge;  // picks up what is waiting
        QCoreApplication::sendPostedEvents();
    }
    EXPECT_TRUE(ran);
}

TEST(ScreenshotPlan, CoversTheLaunchListEveryGroupAndEveryMenuPair) {
    const auto paths = Screenshots::paths();
    ASSERT_EQ(paths.size(), 1U + 4U + 43U);
    EXPECT_TRUE(paths[0].isEmpty());
    EXPECT_EQ(paths[1], QStringList{"Device Info"});
    EXPECT_EQ(paths[5], (QStringList{"Device Info", "IMSI"}));
    EXPECT_EQ(paths.back(), (QStringList{"GSM", "Active Bearers"}));
    std::set<QString> names;
    for (std::size_t i = 0; i < paths.size(); ++i)
        names.insert(Screenshots::fileName(static_cast<int>(i) + 1, paths[i]));
    EXPECT_EQ(names.size(), paths.size());
    EXPECT_EQ(Screenshots::fileName(1, {}), "01-launch.png");
    EXPECT_EQ(Screenshots::fileName(17, {"LTE", "C-DRX"}), "17-lte-c-drx.png");
    EXPECT_EQ(Screenshots::fileName(44, {"GSM", "GSM GPRS Config"}), "44-gsm-gsm-gprs-config.png");
}

TEST(ScreenshotPlan, ChartPagesAreNamedAfterTheirScreen) {
    const auto charts = Screenshots::chartNumbers();
    ASSERT_EQ(charts.size(), 11U);
    EXPECT_EQ(charts.front(), 12);
    EXPECT_EQ(Screenshots::fileName(12, {"LTE", "Serving Cell Meas"}, true),
              "12-lte-serving-cell-meas-chart.png");
}

TEST_F(NavigatorTest, ScreensOfMeasuredQuantitiesOpenTheirChartWhenTheStoreKeepsAHistory) {
    ASSERT_TRUE(navigator.open({"LTE", "Serving Cell Meas"}));
    EXPECT_FALSE(navigator.current()->charted());  // no history kept
    EXPECT_FALSE(navigator.openChart());

    store->setHistory(std::make_shared<History>());
    ASSERT_TRUE(navigator.open({"LTE", "Serving Cell Meas"}));
    EXPECT_TRUE(navigator.current()->charted());
    ASSERT_TRUE(navigator.openChart());
    Screen* chart = navigator.current();
    EXPECT_EQ(navigator.depth(), 4);
    EXPECT_EQ(chart->title(), "LTE serving");
    ASSERT_NE(chart->chart(), nullptr);
    EXPECT_EQ(chart->model(), nullptr);
    EXPECT_FALSE(chart->refreshes());
    EXPECT_FALSE(chart->charted());
    EXPECT_FALSE(navigator.select(0));
    EXPECT_FALSE(navigator.openChart());
    EXPECT_TRUE(chart->chart()->empty());

    ASSERT_TRUE(navigator.open({"LTE", "C-DRX"}));
    EXPECT_FALSE(navigator.current()->charted());
}

TEST(ScreenshotPlan, EveryPlannedScreenCanBeOpened) {
    Navigator navigator(test::emptyStore());
    for (const QStringList& path : Screenshots::paths()) {
        EXPECT_TRUE(navigator.open(path)) << path.join(" / ").toStdString();
        EXPECT_EQ(navigator.depth(), path.size() + 1);
    }
}

// Sets or clears an environment variable for the lifetime of the object.
class ScopedEnv {
  public:
    ScopedEnv(const char* name, const char* value) : name_(name) {
        if (const char* old = std::getenv(name)) old_ = old;
        if (value != nullptr)
            setenv(name, value, 1);
        else
            unsetenv(name);
    }
    ~ScopedEnv() {
        if (old_)
            setenv(name_, old_->c_str(), 1);
        else
            unsetenv(name_);
    }
    ScopedEnv(const ScopedEnv&) = delete;
    ScopedEnv& operator=(const ScopedEnv&) = delete;

  private:
    const char* name_;
    std::optional<std::string> old_;
};

TEST(DisplayAvailable, NoDisplayAndNoOffscreenPlatformMeansNoWindow) {
    const ScopedEnv display("DISPLAY", nullptr);
    const ScopedEnv wayland("WAYLAND_DISPLAY", nullptr);
    {
        const ScopedEnv platform("QT_QPA_PLATFORM", nullptr);
        EXPECT_FALSE(displayAvailable());
    }
    {
        const ScopedEnv platform("QT_QPA_PLATFORM", "xcb");
        EXPECT_FALSE(displayAvailable());
    }
    {
        const ScopedEnv platform("QT_QPA_PLATFORM", "offscreen");
        EXPECT_TRUE(displayAvailable());
    }
    {
        const ScopedEnv platform("QT_QPA_PLATFORM", nullptr);
        const ScopedEnv x11("DISPLAY", ":0");
        EXPECT_TRUE(displayAvailable());
    }
    {
        const ScopedEnv platform("QT_QPA_PLATFORM", nullptr);
        const ScopedEnv emptyX11("DISPLAY", "");
        EXPECT_FALSE(displayAvailable());
        const ScopedEnv way("WAYLAND_DISPLAY", "wayland-0");
        EXPECT_TRUE(displayAvailable());
    }
}

}  // namespace
}  // namespace pyx::qt
