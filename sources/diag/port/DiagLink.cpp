#include "sources/diag/port/DiagLink.h"

#include <mutex>
#include <optional>
#include <set>

#include "sources/diag/port/DiagPort.h"
#include "sources/diag/port/PortFinder.h"
#include "sources/diag/port/QmdlFile.h"
#include "sources/diag/port/StopSignal.h"
#include "sources/diag/session/DiagSession.h"

namespace pyx::diag {

namespace {

// How long one read waits at most; the stream's numbers are published (copied for stats())
// at most every kPublishPeriod while reading, and at every end.
constexpr std::chrono::milliseconds kPumpPeriod{500};
constexpr std::chrono::milliseconds kPublishPeriod{200};

std::string every(std::chrono::milliseconds period) {
    const auto ms = period.count();
    if (ms % 1000 == 0) return "every " + std::to_string(ms / 1000) + " s";
    return "every " + std::to_string(ms) + " ms";
}

std::uint64_t hostTimeMs() {
    return static_cast<std::uint64_t>(std::chrono::duration_cast<std::chrono::milliseconds>(
                                          std::chrono::system_clock::now().time_since_epoch())
                                          .count());
}

// Says the link's attach fault once until it changes or clears: a port that stays missing,
// busy or silent across retries is one line, not one per retry.
class AttachFault {
  public:
    explicit AttachFault(const std::function<void(std::string_view)>& onLine) : onLine_(onLine) {}

    // key: what the fault is (the same key again is not said again), line: what is said.
    void say(const std::string& key, const std::string& line) {
        if (key == last_) return;
        last_ = key;
        if (onLine_) onLine_(line);
    }
    void clear() { last_.clear(); }

  private:
    const std::function<void(std::string_view)>& onLine_;
    std::string last_;
};

std::string kindKey(PortError::Kind kind) {
    switch (kind) {
        case PortError::Kind::Permission:
            return "permission";
        case PortError::Kind::Busy:
            return "busy";
        case PortError::Kind::Gone:
            return "gone";
        case PortError::Kind::Other:
            break;
    }
    return "other";
}

}  // namespace

struct DiagLink::State {
    explicit State(Options o)
        : options(std::move(o)), stream(DiagStream::Options{.now = hostTimeMs, .hostTime = true}) {}

    void publish() {
        const std::lock_guard lock(mutex);
        published = stream.stats();
        lastPublished = std::chrono::steady_clock::now();
    }
    // Publishes unless it was done less than kPublishPeriod ago.
    void publishAtTimes() {
        if (std::chrono::steady_clock::now() - lastPublished >= kPublishPeriod) publish();
    }

    const Options options;
    DiagStream stream;  // kept across re-attaches: the decoders remember the serving cell
    mutable std::mutex mutex;
    StreamStats published;
    std::chrono::steady_clock::time_point lastPublished;  // the link's thread's own
};

DiagLink::DiagLink(Options options) : state_(std::make_unique<State>(std::move(options))) {}

DiagLink::~DiagLink() = default;

StreamStats DiagLink::stats() const {
    const std::lock_guard lock(state_->mutex);
    return state_->published;
}

void DiagLink::run(const std::stop_token& stop, const DiagStream::EventSink& onEvents) {
    const Options& options = state_->options;
    const StopSignal signal(stop);
    AttachFault fault(options.onLine);
    std::set<std::string, std::less<>> sessionFaults;  // said once a run
    const auto sayOnce = [&](std::string_view line) {
        if (sessionFaults.emplace(line).second && options.onLine) options.onLine(line);
    };
    // The session's notes (the modem's version) once per start that succeeds: a modem that
    // fails the start-up again and again is not introduced at every try.
    std::set<std::string, std::less<>> notes;
    const auto note = [&](std::string_view line) {
        if (notes.emplace(line).second && options.onLine) options.onLine(line);
    };
    QmdlFile qmdl(options.qmdlFile, sayOnce);
    const std::string retry = every(options.retryEvery);

    while (!signal.requested()) {
        std::string path = options.path;
        if (path.empty()) {
            const PortSearch search = PortFinder(options.sysfsRoot).find();
            if (!search.device) {
                fault.say("none:" + search.notFoundLine(),
                          search.notFoundLine() + "; looking again " + retry);
                signal.waitFor(options.retryEvery);
                continue;
            }
            path = *search.device;
        }

        try {
            DiagPort port(path);
            state_->stream.reset();
            DiagSession session(port, state_->stream, onEvents, signal,
                                {.commandTimeout = options.commandTimeout,
                                 .onNote = note,
                                 .onFault = sayOnce,
                                 .onBytes = [&qmdl](auto bytes) { qmdl.append(bytes); }});
            if (session.start()) {
                fault.clear();
                notes.clear();
                state_->publish();
                while (!signal.requested()) {
                    session.pump(kPumpPeriod);
                    state_->publishAtTimes();
                }
            }
            session.stop();
            state_->publish();
            return;
        } catch (const PortError& error) {
            const bool gone = error.kind() == PortError::Kind::Gone;
            fault.say("port:" + kindKey(error.kind()) + ":" + error.device(),
                      std::string(error.what()) +
                          (gone ? "; waiting for it to come back (looking " + retry + ")"
                                : "; trying again " + retry));
        } catch (const SessionError& error) {
            fault.say("session:" + path + ":" + error.what(),
                      std::string(error.what()) + "; trying again " + retry);
        }
        state_->publish();
        signal.waitFor(options.retryEvery);
    }
}

}  // namespace pyx::diag
