// The navigation stack behind the window: launch list -> first-level menu -> category screen
// -> third-level placeholder. It creates the controllers, hands each selection forward as the
// screens define, and tells the view what was pushed and popped; the view mirrors it.
#pragma once

#include <QObject>
#include <QString>
#include <QStringList>

#include <memory>
#include <optional>
#include <vector>

#include "metrics/MetricValidator.h"
#include "metrics/history/Chart.h"
#include "ui/DriveTrack.h"
#include "ui/TableController.h"
#include "ui/qt/ChartModel.h"
#include "ui/qt/DriveMapModel.h"
#include "ui/qt/TableModel.h"

namespace pyx::qt {

// One screen on the stack, with its title: a table (its controller and the model the view
// draws) or a chart page (its chart model).
class Screen : public QObject {
    Q_OBJECT
    Q_PROPERTY(QString title READ title CONSTANT)
    Q_PROPERTY(pyx::qt::TableModel* model READ model CONSTANT)
    Q_PROPERTY(bool refreshes READ refreshes CONSTANT)
    Q_PROPERTY(bool leadsFurther READ leadsFurther CONSTANT)
    Q_PROPERTY(bool charted READ charted CONSTANT)
    Q_PROPERTY(pyx::qt::ChartModel* chart READ chart CONSTANT)
    Q_PROPERTY(pyx::qt::DriveMapModel* map READ map CONSTANT)

  public:
    // A table; charted: the chart page it offers, if any.
    Screen(QString title, std::shared_ptr<TableController> controller,
           std::optional<Chart> charted = std::nullopt, QObject* parent = nullptr);
    // A chart page drawing chart (which the screen takes as its child).
    Screen(QString title, ChartModel* chart, QObject* parent = nullptr);
    // The Drive map page drawing map (which the screen takes as its child).
    Screen(QString title, DriveMapModel* map, QObject* parent = nullptr);

    [[nodiscard]] QString title() const { return title_; }
    // The table's model; null for a chart page.
    [[nodiscard]] TableModel* model() const { return model_; }
    // A screen that shows the store: the view reloads it periodically.
    [[nodiscard]] bool refreshes() const { return controller_ && controller_->followsStore(); }
    // Whether its rows are menu entries leading to a further list.
    [[nodiscard]] bool leadsFurther() const { return controller_ && controller_->leadsFurther(); }
    // Whether the table offers a chart page (a button in the title bar).
    [[nodiscard]] bool charted() const { return charted_.has_value(); }
    [[nodiscard]] const std::optional<Chart>& chartOffered() const { return charted_; }
    // The chart page's model; null for a table.
    [[nodiscard]] ChartModel* chart() const { return chart_; }
    // The Drive map page's model; null otherwise.
    [[nodiscard]] DriveMapModel* map() const { return map_; }
    // The table's controller; only for a table.
    [[nodiscard]] TableController& controller() const { return *controller_; }

    // The periodic refresh: posts one reload of the table to the main queue.
    Q_INVOKABLE void update();

  private:
    QString title_;
    std::shared_ptr<TableController> controller_;
    TableModel* model_ = nullptr;
    std::optional<Chart> charted_;
    ChartModel* chart_ = nullptr;
    DriveMapModel* map_ = nullptr;
};

class Navigator : public QObject {
    Q_OBJECT
    Q_PROPERTY(int depth READ depth NOTIFY depthChanged)
    Q_PROPERTY(pyx::qt::Screen* current READ current NOTIFY depthChanged)
    Q_PROPERTY(int refreshIntervalMs READ refreshIntervalMs WRITE setRefreshIntervalMs NOTIFY
                   refreshIntervalMsChanged)
    Q_PROPERTY(bool animated READ animated WRITE setAnimated NOTIFY animatedChanged)
    Q_PROPERTY(bool mapOffered READ mapOffered CONSTANT)
    Q_PROPERTY(QString gpsStatus READ gpsStatus NOTIFY gpsStatusChanged)

  public:
    // validator: the store the category screens read; drive: the track the Drive map page
    // draws and the status line speaks of (none: neither is offered).
    explicit Navigator(std::shared_ptr<MetricValidator> validator,
                       std::shared_ptr<const DriveTrack> drive = {}, QObject* parent = nullptr);
    ~Navigator() override;

    [[nodiscard]] int depth() const { return static_cast<int>(stack_.size()); }
    [[nodiscard]] Screen* current() const { return stack_.back(); }
    Q_INVOKABLE pyx::qt::Screen* screenAt(int level) const;

    // How often an open category screen reloads (5000 ms; tests shorten it).
    [[nodiscard]] int refreshIntervalMs() const { return refreshIntervalMs_; }
    void setRefreshIntervalMs(int ms);
    // Whether the view animates pushes and pops (off while taking screenshots).
    [[nodiscard]] bool animated() const { return animated_; }
    void setAnimated(bool animated);

    // The tap on item index of the top screen: pushes the screen its controller opens. False
    // for a header, an index out of range, or a screen whose rows open nothing.
    Q_INVOKABLE bool select(int index);
    // Whether category screens offer chart pages (the store keeps a history).
    [[nodiscard]] bool chartsOffered() const { return validator_->history() != nullptr; }
    // Pushes the chart page of the top screen; false when it offers none.
    Q_INVOKABLE bool openChart();
    // Whether the launch list offers the Drive map page.
    [[nodiscard]] bool mapOffered() const { return drive_ != nullptr; }
    // Pushes the Drive map page; false when none is offered.
    Q_INVOKABLE bool openDriveMap();
    // The status line's text about GPS; empty without --gps. Refreshed by
    // updateGpsStatus (the window calls it once a second).
    [[nodiscard]] QString gpsStatus() const { return gpsStatus_; }
    Q_INVOKABLE void updateGpsStatus();
    // Pops the top screen; false on the launch list.
    Q_INVOKABLE bool back();
    Q_INVOKABLE void popToRoot();
    // From the launch list, taps the rows whose texts are titles, in order ("LTE", "C-DRX").
    // Stops and answers false at the first title the screen does not show.
    Q_INVOKABLE bool open(const QStringList& titles);

    // The view calls this once its root screen has loaded; the first call emits
    // rootViewDidLoad, later calls do nothing.
    Q_INVOKABLE void rootViewLoaded();
    // The view calls this when a popped screen has left it; the screen is then deleted.
    Q_INVOKABLE void release(pyx::qt::Screen* screen);

  signals:
    void pushed(pyx::qt::Screen* screen);
    void popped();
    void depthChanged();
    void rootViewDidLoad();
    void refreshIntervalMsChanged();
    void animatedChanged();
    void gpsStatusChanged();

  private:
    void push(Screen* screen);

    std::shared_ptr<MetricValidator> validator_;
    std::shared_ptr<const DriveTrack> drive_;
    QString gpsStatus_;
    std::vector<Screen*> stack_;    // children of the navigator, launch list first
    std::vector<Screen*> retired_;  // popped, still drawn by the view until it releases them
    int refreshIntervalMs_ = 5000;
    bool animated_ = true;
    bool rootViewLoaded_ = false;
};

}  // namespace pyx::qt
