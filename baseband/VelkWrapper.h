// The program's only link to the baseband: one velk manager client named "pyxtool", the
// configuration and query commands, and the two event streams handed to the delegate on the
// main queue.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "baseband/VelkWrapperDelegate.h"
#include "baseband/velk/Client.h"
#include "core/MainQueue.h"
#include "core/SerialQueue.h"

namespace pyx {

class VelkWrapper : public std::enable_shared_from_this<VelkWrapper> {
  public:
    // The shared instance, created on first call (on the main thread, during start-up).
    static std::shared_ptr<VelkWrapper> sharedInstance();

    // A client of its own, for tests and tools; the shared instance is made the same way.
    // mainQueue receives the delegate calls.
    static std::shared_ptr<VelkWrapper> create(MainQueue& mainQueue = MainQueue::shared());
    ~VelkWrapper();
    VelkWrapper(const VelkWrapper&) = delete;
    VelkWrapper& operator=(const VelkWrapper&) = delete;

    // The serial queue "com.mirelo.Pyxon.serialQ.queue" on which events are delivered
    // (created once per process).
    static SerialQueue& queue();

    bool addTelxConfigForAppId(std::string_view appId, const std::string& protofFilePath);
    bool removeTelxConfigForAppid(std::string_view appId);
    bool querySpecificMetric(std::string_view appId, std::int32_t triggerRef,
                             std::int32_t triggerType, std::int32_t triggerID,
                             std::int32_t profileID, std::int32_t metricID);
    void listen();

    [[nodiscard]] std::shared_ptr<VelkWrapperDelegate> delegate() const;
    void setDelegate(std::weak_ptr<VelkWrapperDelegate> delegate);

  private:
    explicit VelkWrapper(MainQueue& mainQueue);
    struct Impl;
    std::unique_ptr<Impl> impl_;
};

}  // namespace pyx
