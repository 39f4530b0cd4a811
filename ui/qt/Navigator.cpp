#include "ui/qt/Navigator.h"

#include <QPointer>

#include <algorithm>
#include <chrono>
#include <utility>

#include "core/MainQueue.h"
#include "metrics/history/History.h"
#include "ui/ChartScreens.h"
#include "ui/PyxViewController.h"

namespace pyx::qt {

Screen::Screen(QString title, std::shared_ptr<TableController> controller,
               std::optional<Chart> charted, QObject* parent)
    : QObject(parent),
      title_(std::move(title)),
      controller_(std::move(controller)),
      model_(new TableModel(controller_, this)),
      charted_(charted) {}

Screen::Screen(QString title, ChartModel* chart, QObject* parent)
    : QObject(parent), title_(std::move(title)), chart_(chart) {
    chart_->setParent(this);
}

Screen::Screen(QString title, DriveMapModel* map, QObject* parent)
    : QObject(parent), title_(std::move(title)), map_(map) {
    map_->setParent(this);
}

void Screen::update() {
    if (model_ == nullptr) return;
    MainQueue::shared().post([model = QPointer<TableModel>(model_)] {
        if (model) model->reload();
    });
}

Navigator::Navigator(std::shared_ptr<MetricValidator> validator,
                     std::shared_ptr<const DriveTrack> drive, QObject* parent)
    : QObject(parent), validator_(std::move(validator)), drive_(std::move(drive)) {
    updateGpsStatus();
    stack_.push_back(new Screen(QStringLiteral("Pyxon"),
                                std::make_shared<PyxViewController>(*validator_), std::nullopt,
                                this));
}

Navigator::~Navigator() {
    // The screens' controllers refer to the store: they go before it does.
    qDeleteAll(retired_);
    qDeleteAll(stack_);
}

Screen* Navigator::screenAt(int level) const {
    if (level < 0 || level >= depth()) return nullptr;
    return stack_[static_cast<std::size_t>(level)];
}

void Navigator::setRefreshIntervalMs(int ms) {
    if (ms == refreshIntervalMs_ || ms <= 0) return;
    refreshIntervalMs_ = ms;
    emit refreshIntervalMsChanged();
}

void Navigator::setAnimated(bool animated) {
    if (animated == animated_) return;
    animated_ = animated;
    emit animatedChanged();
}

bool Navigator::select(int index) {
    const Screen* const top = current();
    if (top->model() == nullptr || !top->model()->indexPath(index)) return false;
    const std::optional<Cell> tapped = top->model()->cellAt(index);
    if (!tapped) return false;
    std::optional<Destination> next = top->controller().open(*tapped);
    if (!next) return false;
    std::optional<Chart> charted;
    if (validator_->history())
        if (const auto category = next->controller->shownCategory())
            charted = chartForCategory(*category);
    push(new Screen(QString::fromStdString(next->title), std::move(next->controller), charted,
                    this));
    return true;
}

bool Navigator::openChart() {
    const Screen* const top = current();
    const std::shared_ptr<const History> history = validator_->history();
    if (!top->chartOffered() || !history) return false;
    const Chart chart = *top->chartOffered();
    push(new Screen(QString::fromUtf8(chartTitle(chart)), new ChartModel(history, chart), this));
    return true;
}

bool Navigator::openDriveMap() {
    if (!drive_) return false;
    push(new Screen(QStringLiteral("Drive map"), new DriveMapModel(drive_), this));
    return true;
}

void Navigator::updateGpsStatus() {
    if (!drive_ || !drive_->gpsOn()) return;
    const auto now = std::chrono::duration_cast<std::chrono::nanoseconds>(
                         std::chrono::system_clock::now().time_since_epoch())
                         .count();
    const QString text = QString::fromStdString(drive_->statusText(now));
    if (text == gpsStatus_) return;
    gpsStatus_ = text;
    emit gpsStatusChanged();
}

void Navigator::push(Screen* screen) {
    stack_.push_back(screen);
    emit pushed(screen);
    emit depthChanged();
}

bool Navigator::back() {
    if (stack_.size() <= 1) return false;
    retired_.push_back(stack_.back());
    stack_.pop_back();
    emit popped();
    emit depthChanged();
    return true;
}

void Navigator::popToRoot() {
    while (back()) {
    }
}

bool Navigator::open(const QStringList& titles) {
    popToRoot();
    for (const QString& title : titles) {
        if (current()->model() == nullptr) return false;
        const TableModel& model = *current()->model();
        int found = -1;
        for (int i = 0; i < model.count() && found < 0; ++i) {
            const auto cell = model.cellAt(i);
            if (cell && cell->text && QString::fromStdString(*cell->text) == title) found = i;
        }
        if (found < 0 || !select(found)) return false;
    }
    return true;
}

void Navigator::rootViewLoaded() {
    if (rootViewLoaded_) return;
    rootViewLoaded_ = true;
    emit rootViewDidLoad();
}

void Navigator::release(Screen* screen) {
    const auto found = std::find(retired_.begin(), retired_.end(), screen);
    if (found == retired_.end()) return;
    retired_.erase(found);
    screen->deleteLater();
}

}  // namespace pyx::qt
