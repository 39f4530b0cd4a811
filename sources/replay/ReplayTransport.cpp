#include "sources/replay/ReplayTransport.h"

#include <chrono>
#include <cmath>
#include <stdexcept>
#include <utility>

#include "baseband/velk/Names.h"
#include "core/Format.h"
#include "core/Log.h"
#include "core/PlaybackSpeed.h"
#include "recordings/RecordingError.h"

namespace pyx::replay {
namespace {

using Clock = std::chrono::steady_clock;

}  // namespace

ReplayTransport::ReplayTransport(Options options)
    : options_{std::move(options.file),
               checkedPlaybackSpeed(options.speed, "the replay speed"),
               options.loop,
               std::move(options.backlog),
               options.maxBacklog,
               std::move(options.onEnd),
               std::move(options.onFix)},
      reader_(options_.file) {
    if (options_.onFix)
        reader_.forEachPosition([this](const gps::Fix& fix) {
            fixes_.push_back(fix);
            return true;
        });
}

void ReplayTransport::handFixes(std::int64_t wallNs, std::size_t& next) const {
    for (; next < fixes_.size() && fixes_[next].receivedNs <= wallNs; ++next)
        options_.onFix(fixes_[next]);
}

ReplayTransport::~ReplayTransport() {
    stopThread();
}

velk::Result ReplayTransport::performCommand(const std::string& command, const Value& input,
                                             Value* output) {
    static_cast<void>(input);
    static_cast<void>(output);
    if (command == velk::kCommandAddConfiguration) {
        const std::lock_guard lock(mutex_);
        configured_ = true;
    }
    return velk::Result(velk::kCodeSuccess, "Success");
}

void ReplayTransport::startEvents(EventSink sink) {
    const std::lock_guard control(controlMutex_);
    stopThread();
    {
        const std::lock_guard lock(mutex_);
        if (!configured_ && !playing_) return;
        playing_ = true;
    }
    thread_ = std::jthread(
        [this, sink = std::move(sink)](const std::stop_token& stop) { run(stop, sink); });
}

void ReplayTransport::stopEvents() {
    const std::lock_guard control(controlMutex_);
    stopThread();
}

void ReplayTransport::stopThread() {
    if (!thread_.joinable()) return;
    thread_.request_stop();
    thread_.join();
}

bool ReplayTransport::finished() const {
    const std::lock_guard lock(mutex_);
    return finished_;
}

bool ReplayTransport::waitForRoom(const std::stop_token& stop) {
    if (!options_.backlog) return !stop.stop_requested();
    // The steady state of a replay as fast as it is taken. A full backlog takes the store
    // longer than 2 ms to work through, so polling that often keeps it from running dry
    // without spinning.
    while (options_.backlog() > options_.maxBacklog) {
        std::unique_lock lock(waitMutex_);
        if (wake_.wait_for(lock, stop, std::chrono::milliseconds(2), [] { return false; }) ||
            stop.stop_requested())
            return false;
    }
    return !stop.stop_requested();
}

void ReplayTransport::run(const std::stop_token& stop, const EventSink& sink) {
    const bool timed = options_.speed > 0.0 && std::isfinite(options_.speed);
    for (;;) {
        std::int64_t after = 0;
        {
            const std::lock_guard lock(mutex_);
            after = position_;
        }
        // Timing starts afresh at every start, pass and session: monotonic times of different
        // runs are not comparable.
        std::int64_t session = -1;
        std::int64_t firstMono = 0;
        Clock::time_point start;
        bool stopped = false;
        std::uint64_t thisPass = 0;
        std::size_t nextFix = 0;
        bool resumed = after > 0;
        try {
            recordings::RecordingReader::Filter filter;
            filter.afterID = after;
            reader_.forEach(filter, [&](recordings::RecordedEvent& event) {
                if (timed) {
                    if (event.session != session || event.monoNs < firstMono) {
                        session = event.session;
                        firstMono = event.monoNs;
                        start = Clock::now();
                    }
                    const auto offset = std::chrono::duration<double, std::nano>(
                        static_cast<double>(event.monoNs - firstMono) / options_.speed);
                    const auto due = start + std::chrono::duration_cast<Clock::duration>(offset);
                    std::unique_lock lock(waitMutex_);
                    if (wake_.wait_until(lock, stop, due, [] { return false; }) ||
                        stop.stop_requested()) {
                        stopped = true;
                        return false;
                    }
                }
                if (!waitForRoom(stop)) {
                    stopped = true;
                    return false;
                }
                if (resumed) {
                    // Started again where it stopped: the fixes of what was played are not
                    // played again.
                    while (nextFix < fixes_.size() && fixes_[nextFix].receivedNs < event.wallNs)
                        ++nextFix;
                    resumed = false;
                }
                handFixes(event.wallNs, nextFix);
                sink(event.stream, std::move(event.object));
                ++thisPass;
                const std::lock_guard lock(mutex_);
                position_ = event.id;
                ++played_;
                return true;
            });
        } catch (const recordings::RecordingError& e) {
            systemFault(format("replay %s; the replay stops here", e.what()));
            bool say = false;
            {
                const std::lock_guard lock(mutex_);
                finished_ = true;
                say = !endSaid_;
                endSaid_ = true;
            }
            if (say && options_.onEnd) options_.onEnd(true);
            return;
        }
        if (stopped) return;

        bool say = false;
        std::uint64_t played = 0;
        {
            const std::lock_guard lock(mutex_);
            say = !endSaid_;
            endSaid_ = true;
            played = played_;
            if (!options_.loop || (thisPass == 0 && after == 0)) {
                finished_ = true;
            } else {
                position_ = 0;
            }
        }
        if (say) {
            const auto count = static_cast<unsigned long long>(played);
            if (!options_.loop) {
                systemFault(
                    format("replay %s: end of the recording after %llu events; the screens "
                           "keep the last values",
                           options_.file.c_str(), count));
            } else {
                systemFault(
                    format("replay %s: end of the recording after %llu events; playing it "
                           "again from the start (said once)",
                           options_.file.c_str(), count));
            }
        }
        if (finished()) {
            if (options_.loop)
                systemFault(
                    format("replay %s: the recording holds no events", options_.file.c_str()));
            if (say && options_.onEnd) options_.onEnd(false);
            return;
        }
    }
}

}  // namespace pyx::replay
