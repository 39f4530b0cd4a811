#include "ui/qt/MainQueueBridge.h"

#include <QMetaObject>
#include <QObject>

#include <mutex>

namespace pyx::qt {

// What a wake-up reaches: a receiver living on the GUI thread, cleared under the lock before it
// is destroyed, so that a post racing with shutdown finds nothing rather than a dead object.
struct MainQueueBridge::Link {
    std::mutex mutex;
    std::unique_ptr<QObject> receiver = std::make_unique<QObject>();
};

MainQueueBridge::MainQueueBridge(MainQueue& queue)
    : queue_(queue), link_(std::make_shared<Link>()) {
    queue_.claimCurrentThread();
    queue_.setWakeup([link = link_, &queue] {
        const std::lock_guard lock(link->mutex);
        if (!link->receiver) return;
        QMetaObject::invokeMethod(
            link->receiver.get(), [&queue] { queue.drain(); }, Qt::QueuedConnection);
    });
    // Whatever was posted before the bridge existed.
    if (queue_.pending() > 0)
        QMetaObject::invokeMethod(
            link_->receiver.get(), [&queue] { queue.drain(); }, Qt::QueuedConnection);
}

MainQueueBridge::~MainQueueBridge() {
    queue_.setWakeup({});
    const std::lock_guard lock(link_->mutex);
    link_->receiver.reset();
}

}  // namespace pyx::qt
