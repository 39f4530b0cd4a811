// The layout of a recording file (.pyxrec): an SQLite 3 database in WAL mode.
//
//   PRAGMA application_id  kApplicationID, which marks the file as a recording
//   PRAGMA user_version    kFormatVersion of the writer
//   meta(key, value)       format_version, created_ns, program: about the whole file
//   sessions(...)          one row per recording run (a new one for each --append)
//   events(...)            one row per event, in arrival order (id ascending)
//   positions(...)         one row per GPS fix of a run with --gps (format 2 on)
//
// A reader refuses a format version above its own; a later writer keeps reading older ones.
// Format 1 has no positions; a session appended to it adds the table and makes it format 2.
#pragma once

#include <cstdint>

namespace pyx::recordings {

inline constexpr std::int32_t kApplicationID = 0x50595852;  // "PYXR"
inline constexpr std::int32_t kFormatVersion = 2;

inline constexpr char kSchema[] =
    "CREATE TABLE meta(key TEXT PRIMARY KEY, value);"
    "CREATE TABLE sessions("
    "  id INTEGER PRIMARY KEY,"
    "  start_ns INTEGER NOT NULL,"  // wall clock, ns since 1970
    "  program_version TEXT NOT NULL,"
    "  source TEXT NOT NULL,"  // the --source text
    "  seed INTEGER,"          // where the source has one
    "  speed REAL,"            // where the source has one
    "  host TEXT NOT NULL);"
    "CREATE TABLE events("
    "  id INTEGER PRIMARY KEY,"  // arrival order
    "  session INTEGER NOT NULL,"
    "  stream TEXT NOT NULL,"      // the velk event stream: MetricEvent, TriggerEvent
    "  wall_ns INTEGER NOT NULL,"  // wall clock at arrival, ns since 1970
    "  mono_ns INTEGER NOT NULL,"  // monotonic clock at arrival, ns (per session)
    "  metric_id INTEGER,"         // kKeyMetricID when an integer
    "  payload BLOB,"              // kKeyPayload when bytes
    "  record BLOB NOT NULL);";    // the rest of the event object (RecordCodec)

// Format 2: the positions. A new file gets them beside kSchema; a format-1 file gets them when a
// session is appended.
inline constexpr std::int32_t kFirstFormatWithPositions = 2;
inline constexpr char kPositionsSchema[] =
    "CREATE TABLE IF NOT EXISTS positions("
    "  id INTEGER PRIMARY KEY,"  // arrival order
    "  session INTEGER NOT NULL,"
    "  time_ns INTEGER NOT NULL,"      // the fix's own time (UTC), ns since 1970
    "  received_ns INTEGER NOT NULL,"  // wall clock at arrival, ns since 1970
    "  mode INTEGER NOT NULL,"         // gpsd's mode: 2 = 2D, 3 = 3D
    "  lat REAL NOT NULL,"             // degrees, WGS 84
    "  lon REAL NOT NULL,"
    "  alt_m REAL,"  // metres above mean sea level
    "  speed_mps REAL,"
    "  track_deg REAL,"  // degrees from true north
    "  horizontal_error_m REAL);";

}  // namespace pyx::recordings
