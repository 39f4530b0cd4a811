// Where events come from: the one place that turns a --source text into a velk transport.
// Nothing above baseband/ knows which source runs; the programs only parse the option and
// hand the transport factory to velk::client::SetTransportFactory.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

#include "baseband/velk/Transport.h"
#include "gps/Fix.h"
#include "recordings/RecordingWriter.h"

namespace pyx::sources {

// A source that cannot be had: a --source text not of the forms below, or options that do not
// fit the source; what() is one line saying what is wrong.
class SourceError : public std::invalid_argument {
  public:
    using std::invalid_argument::invalid_argument;
};

// The source a --source text names.
struct SourceChoice {
    enum class Kind { Sim, Modem, Replay, Diag };
    Kind kind = Kind::Sim;
    // modem:N, the modem whose object path ends in /Modem/N; absent for the first modem.
    std::optional<std::uint32_t> modemIndex;
    // replay:FILE, the recording to play; diag:PATH, the DIAG port or capture file (empty for
    // diag alone: the port is found by its USB interface).
    std::string file;
    // diag:FILE naming a regular file: a capture to play rather than a live port.
    bool capture = false;
    // The text as given ("sim", "modem:0", "replay:drive.pyxrec"), for logs and recordings.
    std::string text = "sim";
};

// "sim", "modem", "modem:N", "replay:FILE", "diag", "diag:PORT" or "diag:FILE" (the
// sources/SourceTable.cpp rows). Throws SourceError.
[[nodiscard]] SourceChoice parseSource(std::string_view text);

struct SourceOptions {
    SourceChoice choice;
    std::uint64_t seed = 1;  // sim
    // sim: time runs this much faster; replay and a diag capture: 0 = as fast as taken
    double speed = 1.0;
    bool loop = false;  // replay and a diag capture: start again at the end
    // replay and a diag capture: events handed out and not yet taken in by the store, so that a
    // fast replay waits for it; none: what waits on the client's serial queue and the main queue.
    std::function<std::size_t()> backlog;
    // replay: called once, on the replay's thread, when the replay is over: a recording
    // without loop has ended, the recording holds no events, or it is damaged (damaged: true).
    // A diag capture likewise: its end without loop, or a loop over nothing it decodes.
    std::function<void(bool damaged)> onEnd;
    // replay: called on the replay's thread with the recording's GPS fixes at their times.
    std::function<void(const gps::Fix&)> onFix;
    // diag, live: where to keep the raw byte stream the port sends (a .qmdl); empty: nowhere.
    std::string qmdlFile;
};

// Whether choice is a live DIAG port (diag or diag:PORT, not a capture file).
[[nodiscard]] inline bool isLiveDiag(const SourceChoice& choice) {
    return choice.kind == SourceChoice::Kind::Diag && !choice.capture;
}

// The transport of a source. Throws SourceError for options that do not fit the source
// (a speed the simulated baseband refuses, a replay file that cannot be opened, a qmdlFile for
// a source other than a live diag port...), with one line that names what is wrong.
[[nodiscard]] std::shared_ptr<velk::client::Transport> makeTransport(const SourceOptions& options);

// --record FILE [--append]: where the events of the run are kept.
struct RecordOptions {
    std::string file;
    bool append = false;         // add a session to an existing recording
    std::string programVersion;  // written into the recording's session
};

// A transport that delivers what source delivers and writes every event to a recording as well
// (started at once, on a thread of its own). The session notes options' source text, and its
// seed and speed where they apply. The caller closes the writer before the process ends.
// Throws SourceError with one line naming the file (it exists and no append, it is a
// directory, it is not a recording).
struct RecordedSource {
    std::shared_ptr<velk::client::Transport> transport;
    std::shared_ptr<recordings::RecordingWriter> writer;
};
[[nodiscard]] RecordedSource recordSource(std::shared_ptr<velk::client::Transport> source,
                                          const SourceOptions& options,
                                          const RecordOptions& record);

// Every --source form, "sim, modem, modem:N or replay:FILE", for the option's description.
[[nodiscard]] std::string sourceFormNames();
// The help text that explains the sources, with an example each; shared by pyxon and pyxonctl.
[[nodiscard]] std::string_view sourceHelp();
// The help text that explains --record and --append, with examples; shared likewise.
[[nodiscard]] std::string_view recordingHelp();

}  // namespace pyx::sources
