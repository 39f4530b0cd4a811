#include <unistd.h>

#include <charconv>
#include <climits>
#include <string>

#include "baseband/VelkWrapper.h"
#include "core/MainQueue.h"
#include "recordings/RecordingError.h"
#include "recordings/RecordingTransport.h"
#include "sources/Source.h"
#include "sources/modem/ModemManagerBaseband.h"
#include "sources/replay/ReplayTransport.h"
#include "sources/sim/SimulatedBaseband.h"

namespace pyx::sources {
namespace {

constexpr std::string_view kForms =
    "expected sim, modem, modem:N (N the number at the end of the modem's object path) or "
    "replay:FILE";

std::uint32_t modemIndex(std::string_view text, std::string_view whole) {
    std::uint32_t index = 0;
    const auto* end = text.data() + text.size();
    const auto [at, error] = std::from_chars(text.data(), end, index);
    if (text.empty() || error != std::errc{} || at != end)
        throw SourceError("--source " + std::string(whole) + ": '" + std::string(text) +
                          "' is not a modem number; " + std::string(kForms));
    return index;
}

}  // namespace

SourceChoice parseSource(std::string_view text) {
    SourceChoice choice;
    choice.text = std::string(text);
    if (text == "sim") return choice;
    if (text == "modem" || text.starts_with("modem:")) {
        choice.kind = SourceChoice::Kind::Modem;
        if (text != "modem") choice.modemIndex = modemIndex(text.substr(6), text);
        return choice;
    }
    if (text.starts_with("replay:")) {
        choice.kind = SourceChoice::Kind::Replay;
        choice.file = std::string(text.substr(7));
        if (choice.file.empty())
            throw SourceError("--source replay: names no file; example: replay:drive.pyxrec");
        return choice;
    }
    throw SourceError("--source '" + std::string(text) + "': " + std::string(kForms));
}

std::shared_ptr<velk::client::Transport> makeTransport(const SourceOptions& options) {
    switch (options.choice.kind) {
        case SourceChoice::Kind::Sim:
            try {
                return std::make_shared<sim::SimulatedBaseband>(
                    sim::SimulatedBaseband::Options{options.seed, options.speed, std::nullopt});
            } catch (const std::invalid_argument& e) {
                throw SourceError(e.what());
            }
        case SourceChoice::Kind::Modem: {
            modem::ModemManagerBaseband::Options modem;
            modem.modemIndex = options.choice.modemIndex;
            return std::make_shared<modem::ModemManagerBaseband>(modem);
        }
        case SourceChoice::Kind::Replay:
            try {
                replay::ReplayTransport::Options replayOptions;
                replayOptions.file = options.choice.file;
                replayOptions.speed = options.speed;
                replayOptions.loop = options.loop;
                replayOptions.onEnd = options.onEnd;
                replayOptions.onFix = options.onFix;
                // What the client's serial queue and the main queue still hold: the events
                // handed out that the store has not taken in yet.
                replayOptions.backlog = options.backlog ? options.backlog : [] {
                    return MainQueue::shared().pending() + VelkWrapper::queue().pending();
                };
                return std::make_shared<replay::ReplayTransport>(std::move(replayOptions));
            } catch (const recordings::RecordingError& e) {
                throw SourceError(std::string("--source replay: ") + e.what());
            } catch (const std::invalid_argument& e) {
                throw SourceError(e.what());
            }
    }
    throw SourceError("--source " + options.choice.text + ": unknown source");
}

RecordedSource recordSource(std::shared_ptr<velk::client::Transport> source,
                            const SourceOptions& options, const RecordOptions& record) {
    recordings::RecordingWriter::Options writer;
    writer.path = record.file;
    writer.append = record.append;
    writer.session.programVersion = record.programVersion;
    writer.session.source = options.choice.text;
    if (options.choice.kind == SourceChoice::Kind::Sim)
        writer.session.seed = static_cast<std::int64_t>(options.seed);
    if (options.choice.kind != SourceChoice::Kind::Modem) writer.session.speed = options.speed;
    char host[HOST_NAME_MAX + 1] = {};
    if (gethostname(host, sizeof host - 1) == 0) writer.session.host = host;
    try {
        auto recording = std::make_shared<recordings::RecordingWriter>(std::move(writer));
        auto transport =
            std::make_shared<recordings::RecordingTransport>(std::move(source), recording);
        return RecordedSource{std::move(transport), std::move(recording)};
    } catch (const recordings::RecordingError& e) {
        throw SourceError(std::string("--record ") + e.what());
    }
}

std::string_view sourceHelp() {
    return "Sources (--source):\n"
           "  sim            the built-in simulated baseband (default); --seed and --speed apply\n"
           "                 example: --source sim --seed 7 --speed 20\n"
           "  modem          the first modem ModemManager knows, on the system D-Bus\n"
           "                 example: --source modem\n"
           "  modem:N        the modem whose object path ends in /Modem/N\n"
           "                 example: --source modem:0\n"
           "  replay:FILE    a recording made with --record; --speed (0 = as fast as the store\n"
           "                 takes it) and --loop apply\n"
           "                 example: --source replay:drive.pyxrec --speed 10\n";
}

std::string_view recordingHelp() {
    return "Recording (--record FILE, --append):\n"
           "  every event that reaches the client goes, raw and in order, to FILE (an SQLite\n"
           "  database, .pyxrec), written by a thread of its own and committed at least every\n"
           "  500 ms. An existing FILE is refused unless --append adds a new session to it.\n"
           "  When writing fails (disk full, read-only folder, file removed) one line says so\n"
           "  and the recording stops; everything else goes on. Should the writer fall 65,536\n"
           "  events behind, later events are dropped and counted until it catches up (said\n"
           "  once, counted when the recording closes).\n"
           "  example: --record drive.pyxrec\n"
           "  example: --source modem --record drive.pyxrec --append\n"
           "  look at it later: pyxonctl info drive.pyxrec; pyxonctl export drive.pyxrec "
           "--format csv\n";
}

}  // namespace pyx::sources
