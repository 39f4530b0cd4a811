// Lets the Qt event loop drain the main queue: every post, from any thread, schedules one
// drain on the thread that owns the bridge (the GUI thread), which becomes the queue's main
// thread. Destroying the bridge unhooks it before the event loop's objects go away.
#pragma once

#include <memory>

#include "core/MainQueue.h"

namespace pyx::qt {

class MainQueueBridge {
  public:
    explicit MainQueueBridge(MainQueue& queue = MainQueue::shared());
    ~MainQueueBridge();
    MainQueueBridge(const MainQueueBridge&) = delete;
    MainQueueBridge& operator=(const MainQueueBridge&) = delete;

  private:
    struct Link;
    MainQueue& queue_;
    std::shared_ptr<Link> link_;
};

}  // namespace pyx::qt
