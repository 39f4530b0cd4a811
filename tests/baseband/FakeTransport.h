// A transport that records every command it is given and emits events when the test says so.
#pragma once

#include <mutex>
#include <string>
#include <utility>
#include <vector>

#include "baseband/velk/Transport.h"

namespace pyx::testing {

struct SentCommand {
    std::string name;
    Value input;
};

class FakeTransport : public velk::client::Transport {
  public:
    void connect(const std::string& clientName) override {
        const std::lock_guard lock(mutex_);
        clientName_ = clientName;
    }

    velk::Result performCommand(const std::string& command, const Value& input,
                                Value* output) override {
        const std::lock_guard lock(mutex_);
        commands_.push_back({command, input});
        if (output) *output = Value(Dict{{"reply", Value("ignored")}});
        return answer_;
    }

    void startEvents(EventSink sink) override {
        const std::lock_guard lock(mutex_);
        ++starts_;
        sink_ = std::move(sink);
        calls_.emplace_back("start");
    }

    void stopEvents() override {
        const std::lock_guard lock(mutex_);
        ++stops_;
        sink_ = nullptr;
        calls_.emplace_back("stop");
    }

    // Hands one event to the current sink, if delivery is on; returns whether it was.
    bool emit(const std::string& event, Value object) {
        const std::lock_guard lock(mutex_);
        if (!sink_) return false;
        sink_(event, std::move(object));
        return true;
    }

    void answerWith(velk::Result result) {
        const std::lock_guard lock(mutex_);
        answer_ = std::move(result);
    }

    [[nodiscard]] std::vector<SentCommand> commands() const {
        const std::lock_guard lock(mutex_);
        return commands_;
    }
    [[nodiscard]] std::vector<std::string> switchCalls() const {
        const std::lock_guard lock(mutex_);
        return calls_;
    }
    [[nodiscard]] bool delivering() const {
        const std::lock_guard lock(mutex_);
        return static_cast<bool>(sink_);
    }
    [[nodiscard]] int starts() const {
        const std::lock_guard lock(mutex_);
        return starts_;
    }
    [[nodiscard]] std::string clientName() const {
        const std::lock_guard lock(mutex_);
        return clientName_;
    }

  private:
    mutable std::mutex mutex_;
    std::string clientName_;
    std::vector<SentCommand> commands_;
    std::vector<std::string> calls_;
    EventSink sink_;
    velk::Result answer_{0, "Success"};
    int starts_ = 0;
    int stops_ = 0;
};

// Keys of a dictionary value, in order.
inline std::vector<std::string> keysOf(const Value& dict) {
    std::vector<std::string> keys;
    for (const auto& entry : dict.asDict()) keys.push_back(entry.key);
    return keys;
}

}  // namespace pyx::testing
