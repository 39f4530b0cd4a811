#include "baseband/velk/Client.h"

#include <cstdint>
#include <map>
#include <mutex>
#include <utility>

namespace velk::client {

// Shared between the manager and the tasks it posts: a task that finds the state gone, or
// delivery restarted since it was posted, drops its event.
struct Manager::State {
    State(std::string clientName, pyx::SerialQueue& serialQueue,
          std::shared_ptr<Transport> baseband)
        : name(std::move(clientName)), queue(serialQueue), transport(std::move(baseband)) {}

    const std::string name;
    pyx::SerialQueue& queue;
    const std::shared_ptr<Transport> transport;

    // Serialises EventsOn/EventsOff, which call into the transport.
    std::mutex switchMutex;

    std::mutex mutex;  // guards what follows
    std::map<std::string, std::function<void(const pyx::Value&)>, std::less<>> handlers;
    bool delivering = false;
    std::uint64_t generation = 0;  // incremented by every start and stop of delivery

    // Runs on the queue.
    void deliver(std::uint64_t postedIn, const std::string& event, const pyx::Value& object) {
        std::function<void(const pyx::Value&)> handler;
        {
            const std::lock_guard lock(mutex);
            if (!delivering || generation != postedIn) return;
            const auto it = handlers.find(event);
            if (it == handlers.end()) return;
            handler = it->second;
        }
        handler(object);
    }

    void stop() {
        const std::lock_guard switching(switchMutex);
        {
            const std::lock_guard lock(mutex);
            if (!delivering) return;
            delivering = false;
            ++generation;
        }
        if (transport) transport->stopEvents();
    }
};

Manager::Manager(std::string name, pyx::SerialQueue& queue, std::shared_ptr<Transport> transport)
    : state_(std::make_shared<State>(std::move(name), queue, std::move(transport))) {
    if (state_->transport) state_->transport->connect(state_->name);
}

Manager::~Manager() {
    state_->stop();
}

const std::string& Manager::name() const {
    return state_->name;
}
pyx::SerialQueue& Manager::queue() const {
    return state_->queue;
}

namespace {

struct FactorySlot {
    std::mutex mutex;
    TransportFactory factory;
};

FactorySlot& factorySlot() {
    static FactorySlot slot;
    return slot;
}

Result noTransport() {
    return Result(kCodeNoTransport, "no baseband transport");
}

}  // namespace

void SetTransportFactory(TransportFactory factory) {
    FactorySlot& slot = factorySlot();
    const std::lock_guard lock(slot.mutex);
    slot.factory = std::move(factory);
}

std::shared_ptr<Manager> CreateManager(const std::string& name, pyx::SerialQueue& queue) {
    TransportFactory factory;
    {
        FactorySlot& slot = factorySlot();
        const std::lock_guard lock(slot.mutex);
        factory = slot.factory;
    }
    return CreateManager(name, queue, factory ? factory() : nullptr);
}

std::shared_ptr<Manager> CreateManager(const std::string& name, pyx::SerialQueue& queue,
                                       std::shared_ptr<Transport> transport) {
    return std::make_shared<Manager>(name, queue, std::move(transport));
}

Result PerformCommand(std::shared_ptr<Manager> manager, const std::string& command,
                      const pyx::Value& input, pyx::Value* output) {
    if (!manager || !manager->state_->transport) return noTransport();
    return manager->state_->transport->performCommand(command, input, output);
}

void RegisterEventHandler(std::shared_ptr<Manager> manager, const std::string& event,
                          std::function<void(const pyx::Value& event)> handler) {
    if (!manager) return;
    Manager::State& state = *manager->state_;
    const std::lock_guard lock(state.mutex);
    state.handlers.insert_or_assign(event, std::move(handler));
}

void EventsOn(std::shared_ptr<Manager> manager) {
    if (!manager) return;
    const std::shared_ptr<Manager::State>& state = manager->state_;
    const std::lock_guard switching(state->switchMutex);
    std::uint64_t generation = 0;
    {
        const std::lock_guard lock(state->mutex);
        if (state->delivering) return;
        state->delivering = true;
        generation = ++state->generation;
    }
    if (!state->transport) return;
    state->transport->startEvents([weak = std::weak_ptr<Manager::State>(state), generation](
                                      const std::string& event, pyx::Value object) {
        const std::shared_ptr<Manager::State> alive = weak.lock();
        if (!alive) return;
        alive->queue.post([weak, generation, event, object = std::move(object)] {
            if (const auto target = weak.lock()) target->deliver(generation, event, object);
        });
    });
}

void EventsOff(std::shared_ptr<Manager> manager) {
    if (manager) manager->state_->stop();
}

}  // namespace velk::client
