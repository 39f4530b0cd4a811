// Writes the events of one session to a recording file, off the caller's thread.
//
// add() stamps the event with the arrival time and puts it on a bounded queue; a writer
// thread of its own takes the queue and inserts into the file in transactions of at most
// commitInterval (WAL mode), so a process that is killed loses at most that last stretch and
// the file always opens afterwards.
//
// add() never blocks for long: when the queue is full the event is dropped and counted, and
// the first drop is said once on the system log. A write that fails (disk full, the folder or
// the file made read-only, the file removed or replaced) is said in one line; the recording
// stops there and add() ignores what comes after, while the program goes on.
#pragma once

#include <chrono>
#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "core/Value.h"
#include "gps/Fix.h"
#include "recordings/RecordingSession.h"

namespace pyx::recordings {

class RecordingWriter {
  public:
    struct Options {
        std::string path;
        // Add a session to an existing recording instead of refusing it.
        bool append = false;
        // Describes this run; id and startNs are filled in by the writer.
        RecordingSession session;
        std::size_t queueCapacity = 65536;
        std::chrono::milliseconds commitInterval{500};
    };

    struct Counts {
        std::uint64_t recorded = 0;   // committed to the file
        std::uint64_t dropped = 0;    // lost to a full queue or after a write failed
        bool stopped = false;         // a write failed: nothing more is written
        std::uint64_t positions = 0;  // GPS fixes committed to the file
    };

    // Refuses an existing file without append, and a path that is a directory, with a
    // RecordingError (checked here, before anything runs). Opening and writing happen on the
    // writer thread: a failure there is reported as the run goes on.
    explicit RecordingWriter(Options options);
    // Writes what is queued, then closes the file (as close()).
    ~RecordingWriter();
    RecordingWriter(const RecordingWriter&) = delete;
    RecordingWriter& operator=(const RecordingWriter&) = delete;

    // One event as it arrives; safe from any thread.
    void add(std::string_view stream, const Value& object);
    void add(std::string_view stream, Value&& object);
    // One GPS fix, kept in the positions table in the order it came among the events; safe
    // from any thread. A full queue drops it as it would an event.
    void addFix(const gps::Fix& fix);
    // Blocks until every event added before the call is committed (or the recording stopped).
    void flush();
    // Commits what is queued, closes the file and says how many events it holds; add() is
    // ignored afterwards. Safe to call more than once.
    void close();

    [[nodiscard]] Counts counts() const;

  private:
    struct State;
    std::shared_ptr<State> state_;
};

}  // namespace pyx::recordings
