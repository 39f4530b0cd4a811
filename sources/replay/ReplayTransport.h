// A recording played back as a source: the events of a .pyxrec file go to the client in their
// order, with their original spacing divided by the speed, as if the baseband sent them now.
//
// Commands are accepted and answer nothing: the recording already holds what the baseband
// answered then. Events flow from the first startEvents after a configuration was pushed (as
// the start-up sequence does), and a later restart goes on where the replay was.
//
// However fast it plays, the replay waits while more than maxBacklog events are handed out
// and not yet taken in by the store (the backlog function), so memory stays flat. At the end
// it says so once on the system log; with loop it starts again from the first event.
#pragma once

#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <mutex>
#include <stop_token>
#include <string>
#include <thread>
#include <vector>

#include "baseband/velk/Transport.h"
#include "gps/Fix.h"
#include "recordings/RecordingReader.h"

namespace pyx::replay {

class ReplayTransport : public velk::client::Transport {
  public:
    struct Options {
        std::string file;
        // Original timing divided by this; 0 (or infinity) plays as fast as it is taken.
        double speed = 1.0;
        bool loop = false;
        // Events handed out and not yet taken by the store; none: no limit.
        std::function<std::size_t()> backlog;
        std::size_t maxBacklog = 1024;
        // Called once, on the replay's thread, when the replay is over: after the last event
        // without loop, at once for a recording that holds no events (loop or not), or where a
        // damaged recording breaks off (damaged: true).
        std::function<void(bool damaged)> onEnd;
        // Called on the replay's thread with the recording's GPS fixes, each just before the
        // first event that arrived after it when recorded.
        std::function<void(const gps::Fix&)> onFix;
    };

    // Opens and checks the file; throws recordings::RecordingError (one line naming the file)
    // and std::invalid_argument for a negative or NaN speed.
    explicit ReplayTransport(Options options);
    ~ReplayTransport() override;
    ReplayTransport(const ReplayTransport&) = delete;
    ReplayTransport& operator=(const ReplayTransport&) = delete;

    velk::Result performCommand(const std::string& command, const Value& input,
                                Value* output) override;
    void startEvents(EventSink sink) override;
    void stopEvents() override;

    // Whether the replay reached the end of the recording (without loop: it is over).
    [[nodiscard]] bool finished() const;

  private:
    // Hands on the fixes that had arrived by wallNs; next: the first not yet handed on.
    void handFixes(std::int64_t wallNs, std::size_t& next) const;
    void run(const std::stop_token& stop, const EventSink& sink);
    // Waits until the store has caught up; false when asked to stop meanwhile.
    bool waitForRoom(const std::stop_token& stop);
    void stopThread();

    const Options options_;
    recordings::RecordingReader reader_;
    std::vector<gps::Fix> fixes_;  // with onFix: the recording's, by arrival

    std::mutex controlMutex_;   // serialises starting and stopping the thread
    mutable std::mutex mutex_;  // guards what follows
    bool configured_ = false;
    bool playing_ = false;
    std::int64_t position_ = 0;  // id of the last event handed out
    std::uint64_t played_ = 0;
    bool finished_ = false;
    bool endSaid_ = false;

    std::mutex waitMutex_;
    std::condition_variable_any wake_;
    std::jthread thread_;
};

}  // namespace pyx::replay
