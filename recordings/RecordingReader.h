// Reads a recording file: checks that it is one (and a format this program reads), tells what
// it holds, and hands out its events in arrival order.
//
// Every problem is a RecordingError naming the file: missing, not a regular file, not a
// recording, a newer format, damaged. A damaged file (truncated, overwritten) still hands out
// the events before the damage, then throws Damaged saying how many were read.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "gps/Fix.h"
#include "recordings/RecordedEvent.h"
#include "recordings/RecordingSession.h"

namespace pyx::recordings {

class SqliteDatabase;

class RecordingReader {
  public:
    // Which events to hand out; each absent field lets everything through.
    struct Filter {
        std::vector<std::int64_t> metricIDs;  // any of these metric IDs
        std::optional<std::int64_t> fromNs;   // wall clock at arrival >= fromNs
        std::optional<std::int64_t> toNs;     // wall clock at arrival <= toNs
        std::optional<std::string> stream;    // only this stream (velk::kEventMetric, ...)
        std::int64_t afterID = 0;             // events after this position (RecordedEvent::id)
    };

    struct Summary {
        std::uint64_t events = 0;
        std::optional<std::int64_t> firstNs;
        std::optional<std::int64_t> lastNs;
        // Metric ID -> number of events with it (events without one are not counted here).
        std::map<std::int64_t, std::uint64_t> kinds;
        std::int32_t formatVersion = 0;
        std::vector<RecordingSession> sessions;
        // The GPS fixes (--gps): how many, their own times' span, and the box they lie in.
        struct Positions {
            std::uint64_t count = 0;
            std::int64_t firstNs = 0;
            std::int64_t lastNs = 0;
            double south = 0, west = 0, north = 0, east = 0;  // degrees
        };
        std::optional<Positions> positions;  // none in the file (or a format-1 file)
    };

    // Opens and checks path; throws RecordingError.
    explicit RecordingReader(std::string path);
    ~RecordingReader();
    RecordingReader(RecordingReader&&) noexcept;
    RecordingReader& operator=(RecordingReader&&) noexcept;

    // Counts, times and kinds of the whole file. Throws RecordingError.
    [[nodiscard]] Summary summary() const;

    // Calls visit with each event that passes filter, in arrival order, until visit returns
    // false; returns how many events were handed out. Throws RecordingError (Damaged, with
    // eventsRead) when the file breaks off.
    std::uint64_t forEach(const Filter& filter,
                          const std::function<bool(RecordedEvent& event)>& visit) const;

    // Calls visit with each GPS fix in the order they arrived (their wall-clock arrival time
    // then their order in the file) until visit returns false; returns how many were handed
    // out. A file without positions hands out none. Throws RecordingError (Damaged).
    std::uint64_t forEachPosition(const std::function<bool(const gps::Fix& fix)>& visit) const;

  private:
    [[nodiscard]] bool hasPositions() const;

    std::string path_;
    std::unique_ptr<SqliteDatabase> db_;
    std::int32_t formatVersion_ = 0;
};

}  // namespace pyx::recordings
