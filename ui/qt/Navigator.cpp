#include "ui/qt/Navigator.h"

#include <QPointer>

#include <algorithm>
#include <utility>

#include "core/MainQueue.h"
#include "ui/FirstLevelViewController.h"
#include "ui/PyxViewController.h"
#include "ui/SecondLevelViewController.h"
#include "ui/ThirdLevelViewController.h"

namespace pyx::qt {

Screen::Screen(Level level, QString title, std::shared_ptr<TableController> controller,
               QObject* parent)
    : QObject(parent),
      level_(level),
      title_(std::move(title)),
      controller_(std::move(controller)),
      model_(new TableModel(controller_, this)) {}

void Screen::update() {
    MainQueue::shared().post([model = QPointer<TableModel>(model_)] {
        if (model) model->reload();
    });
}

Navigator::Navigator(std::shared_ptr<MetricValidator> validator, QObject* parent)
    : QObject(parent), validator_(std::move(validator)) {
    stack_.push_back(new Screen(Screen::Launch, QStringLiteral("Pyxon"),
                                std::make_shared<PyxViewController>(), this));
}

Navigator::~Navigator() = default;

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
    Screen* const top = current();
    const auto path = top->model()->indexPath(index);
    if (!path) return false;
    const int row = path->second;
    const auto fromText = [](const std::optional<std::string>& text) {
        return text ? QString::fromStdString(*text) : QString();
    };
    switch (top->level()) {
        case Screen::Launch: {
            auto menu = std::make_shared<FirstLevelViewController>(validator_);
            static_cast<PyxViewController&>(top->controller()).prepareFirstLevel(*menu, row);
            const QString title = fromText(menu->seguedThroughRow());
            push(new Screen(Screen::FirstLevel, title, std::move(menu), this));
            return true;
        }
        case Screen::FirstLevel: {
            auto category = std::make_shared<SecondLevelViewController>(validator_);
            static_cast<FirstLevelViewController&>(top->controller())
                .prepareSecondLevel(*category, row);
            const QString title = fromText(category->seguedThroughRow());
            push(new Screen(Screen::SecondLevel, title, std::move(category), this));
            return true;
        }
        case Screen::SecondLevel: {
            const auto& from = static_cast<SecondLevelViewController&>(top->controller());
            const std::optional<Cell> tapped = top->model()->cellAt(index);
            if (!tapped) return false;
            auto details = std::make_shared<ThirdLevelViewController>();
            // The category screen hands nothing on: the placeholder's selections stay unset.
            // Only the title bar names the entry that was tapped.
            from.prepareForSegue(*details, &*tapped);
            QString title = fromText(tapped->text);
            if (title.isEmpty()) title = top->title();
            push(new Screen(Screen::ThirdLevel, title, std::move(details), this));
            return true;
        }
        default:
            return false;
    }
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
