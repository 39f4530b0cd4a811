// What carries commands to a baseband and events back: the simulated baseband now, a system
// service or a recording later. A velk manager owns one transport.
#pragma once

#include <functional>
#include <string>

#include "baseband/velk/Result.h"
#include "core/Value.h"

namespace velk::client {

class Transport {
  public:
    // Receives one event: the name of its stream (kEventTrigger, kEventMetric) and its
    // dictionary. Called on a thread of the transport's choosing.
    using EventSink = std::function<void(const std::string& event, pyx::Value object)>;

    virtual ~Transport() = default;

    // Called once, when the manager that owns the transport is created.
    virtual void connect(const std::string& clientName) { static_cast<void>(clientName); }

    // Sends one command and waits for its outcome; a reply object may be stored in *output
    // (output may be null).
    virtual Result performCommand(const std::string& command, const pyx::Value& input,
                                  pyx::Value* output) = 0;

    // Starts handing events to sink, replacing any earlier sink.
    virtual void startEvents(EventSink sink) = 0;
    // Stops handing events out. When it returns, the sink is neither running nor called again.
    virtual void stopEvents() = 0;
};

}  // namespace velk::client
