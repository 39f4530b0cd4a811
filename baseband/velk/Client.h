// The baseband manager client: a manager connects to the baseband through a transport, sends
// it commands synchronously and delivers its events to registered handlers on a serial queue.
#pragma once

#include <functional>
#include <memory>
#include <string>

#include "baseband/velk/Names.h"
#include "baseband/velk/Result.h"
#include "baseband/velk/Transport.h"
#include "core/SerialQueue.h"
#include "core/Value.h"

namespace velk::client {

// One client of the baseband. Made by CreateManager; used through the functions below.
class Manager {
  public:
    Manager(std::string name, pyx::SerialQueue& queue, std::shared_ptr<Transport> transport);
    // Stops event delivery; events still waiting on the queue are dropped.
    ~Manager();
    Manager(const Manager&) = delete;
    Manager& operator=(const Manager&) = delete;

    [[nodiscard]] const std::string& name() const;
    [[nodiscard]] pyx::SerialQueue& queue() const;

  private:
    friend Result PerformCommand(std::shared_ptr<Manager>, const std::string&, const pyx::Value&,
                                 pyx::Value*);
    friend void RegisterEventHandler(std::shared_ptr<Manager>, const std::string&,
                                     std::function<void(const pyx::Value&)>);
    friend void EventsOn(std::shared_ptr<Manager>);
    friend void EventsOff(std::shared_ptr<Manager>);

    struct State;
    std::shared_ptr<State> state_;
};

using TransportFactory = std::function<std::shared_ptr<Transport>()>;

// The process's transport factory, used by every later CreateManager(name, queue). Without
// one, managers have no transport and their commands fail with kCodeNoTransport.
void SetTransportFactory(TransportFactory factory);

// A manager named name whose events are delivered on queue, over the process's transport.
// The queue must outlive the manager.
std::shared_ptr<Manager> CreateManager(const std::string& name, pyx::SerialQueue& queue);
// The same over a given transport (may be null: commands then fail with kCodeNoTransport).
std::shared_ptr<Manager> CreateManager(const std::string& name, pyx::SerialQueue& queue,
                                       std::shared_ptr<Transport> transport);

// Sends one command and returns its outcome; a reply may be stored in *output.
Result PerformCommand(std::shared_ptr<Manager> manager, const std::string& command,
                      const pyx::Value& input, pyx::Value* output);

// Registers handler for the named event stream; a second handler for the same stream
// replaces the first. Handlers run on the manager's queue, one event dictionary each.
void RegisterEventHandler(std::shared_ptr<Manager> manager, const std::string& event,
                          std::function<void(const pyx::Value& event)> handler);

// Starts delivering events to the registered handlers (nothing changes if already on).
void EventsOn(std::shared_ptr<Manager> manager);
// Stops delivery; events already waiting on the queue are dropped.
void EventsOff(std::shared_ptr<Manager> manager);

}  // namespace velk::client
