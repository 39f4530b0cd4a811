#include "sources/SourceTable.h"

#include <sys/stat.h>

#include <cerrno>
#include <charconv>
#include <cstring>
#include <stdexcept>
#include <string>
#include <utility>

#include "baseband/VelkWrapper.h"
#include "core/MainQueue.h"
#include "recordings/RecordingError.h"
#include "sources/diag/DiagTransport.h"
#include "sources/modem/ModemManagerBaseband.h"
#include "sources/replay/ReplayTransport.h"
#include "sources/sim/SimulatedBaseband.h"

namespace pyx::sources {
namespace {

// What the client's serial queue and the main queue still hold: the events handed out that the
// store has not taken in yet.
std::size_t storeBacklog() {
    return MainQueue::shared().pending() + VelkWrapper::queue().pending();
}

// --- sim ---

constexpr SourceForm kSimForms[] = {{"sim", ""}};

bool simClaims(std::string_view text) {
    return text == "sim";
}

void simParse(std::string_view, SourceChoice&) {}

std::shared_ptr<velk::client::Transport> simMake(const SourceOptions& options) {
    try {
        return std::make_shared<sim::SimulatedBaseband>(
            sim::SimulatedBaseband::Options{options.seed, options.speed, std::nullopt});
    } catch (const std::invalid_argument& e) {
        throw SourceError(e.what());
    }
}

// --- modem ---

constexpr SourceForm kModemForms[] = {
    {"modem", ""}, {"modem:N", " (N the number at the end of the modem's object path)"}};

bool modemClaims(std::string_view text) {
    return text == "modem" || text.starts_with("modem:");
}

void modemParse(std::string_view text, SourceChoice& choice) {
    if (text == "modem") return;
    const std::string_view number = text.substr(6);
    std::uint32_t index = 0;
    const auto* end = number.data() + number.size();
    const auto [at, error] = std::from_chars(number.data(), end, index);
    if (number.empty() || error != std::errc{} || at != end)
        throw SourceError("--source " + std::string(text) + ": '" + std::string(number) +
                          "' is not a modem number; " + expectedForms());
    choice.modemIndex = index;
}

std::shared_ptr<velk::client::Transport> modemMake(const SourceOptions& options) {
    modem::ModemManagerBaseband::Options modem;
    modem.modemIndex = options.choice.modemIndex;
    return std::make_shared<modem::ModemManagerBaseband>(modem);
}

// --- replay ---

constexpr SourceForm kReplayForms[] = {{"replay:FILE", ""}};

bool replayClaims(std::string_view text) {
    return text.starts_with("replay:");
}

void replayParse(std::string_view text, SourceChoice& choice) {
    choice.file = std::string(text.substr(7));
    if (choice.file.empty())
        throw SourceError("--source replay: names no file; example: replay:drive.pyxrec");
}

std::shared_ptr<velk::client::Transport> replayMake(const SourceOptions& options) {
    try {
        replay::ReplayTransport::Options replayOptions;
        replayOptions.file = options.choice.file;
        replayOptions.speed = options.speed;
        replayOptions.loop = options.loop;
        replayOptions.onEnd = options.onEnd;
        replayOptions.onFix = options.onFix;
        replayOptions.backlog = options.backlog ? options.backlog : storeBacklog;
        return std::make_shared<replay::ReplayTransport>(std::move(replayOptions));
    } catch (const recordings::RecordingError& e) {
        throw SourceError(std::string("--source replay: ") + e.what());
    } catch (const std::invalid_argument& e) {
        throw SourceError(e.what());
    }
}

// --- diag ---

constexpr SourceForm kDiagForms[] = {
    {"diag", ""},
    {"diag:PORT", " (a tty or a character device, as /dev/ttyUSB0)"},
    {"diag:FILE", " (a capture of the port: .qmdl, .mi2log, .bin)"}};

bool diagClaims(std::string_view text) {
    return text == "diag" || text.starts_with("diag:");
}

// diag:PATH by what PATH is: a character device is a port, a regular file a capture. A path
// under /dev that is not there is a port not there yet (a modem still starting, or not yet
// plugged in), which the link waits for; any other missing path is refused.
void diagParse(std::string_view text, SourceChoice& choice) {
    if (text == "diag") return;
    const std::string path(text.substr(5));
    const std::string where = "--source " + std::string(text) + ": ";
    if (path.empty())
        throw SourceError(
            "--source diag: names no port or file; example: diag:/dev/ttyUSB0 or "
            "diag:drive.qmdl");
    choice.file = path;
    struct stat info {};
    if (::stat(path.c_str(), &info) != 0) {
        const int error = errno;
        if (error == ENOENT && path.starts_with("/dev/")) return;  // a port to wait for
        if (error == ENOENT)
            throw SourceError(where +
                              "no such file (a capture must exist; a port under /dev/ that is not "
                              "there yet is waited for)");
        throw SourceError(where + std::strerror(error));
    }
    if (S_ISCHR(info.st_mode)) return;
    if (S_ISREG(info.st_mode)) {
        choice.capture = true;
        return;
    }
    throw SourceError(where +
                      (S_ISDIR(info.st_mode) ? "is a directory" : "is neither a port nor a file") +
                      "; " + expectedForms());
}

std::shared_ptr<velk::client::Transport> diagMake(const SourceOptions& options) {
    diag::DiagTransport::Options diagOptions;
    if (options.choice.capture) {
        diagOptions.capture = options.choice.file;
        diagOptions.speed = options.speed;
        diagOptions.loop = options.loop;
        diagOptions.onEnd = options.onEnd;
        diagOptions.backlog = options.backlog ? options.backlog : storeBacklog;
    } else {
        diagOptions.link.path = options.choice.file;
        diagOptions.link.qmdlFile = options.qmdlFile;
    }
    try {
        return std::make_shared<diag::DiagTransport>(std::move(diagOptions));
    } catch (const diag::DiagCaptureError& e) {
        throw SourceError(std::string("--source diag:") + e.what());
    } catch (const std::invalid_argument& e) {
        throw SourceError(e.what());
    }
}

constexpr SourceRow kRows[] = {
    {SourceChoice::Kind::Sim, kSimForms,
     "  sim            the built-in simulated baseband (default); --seed and --speed apply\n"
     "                 example: --source sim --seed 7 --speed 20\n",
     simClaims, simParse, simMake},
    {SourceChoice::Kind::Modem, kModemForms,
     "  modem          the first modem ModemManager knows, on the system D-Bus\n"
     "                 example: --source modem\n"
     "  modem:N        the modem whose object path ends in /Modem/N\n"
     "                 example: --source modem:0\n",
     modemClaims, modemParse, modemMake},
    {SourceChoice::Kind::Replay, kReplayForms,
     "  replay:FILE    a recording made with --record; --speed (0 = as fast as the store\n"
     "                 takes it) and --loop apply\n"
     "                 example: --source replay:drive.pyxrec --speed 10\n",
     replayClaims, replayParse, replayMake},
    {SourceChoice::Kind::Diag, kDiagForms,
     "  diag           a Qualcomm modem's diagnostic (DIAG) port, found by its USB\n"
     "                 interface; --qmdl FILE keeps the raw stream it sends\n"
     "                 example: --source diag --qmdl drive.qmdl\n"
     "  diag:PORT      that port: a tty or a character device; a port under /dev that is\n"
     "                 not there yet (the modem still starting) is waited for\n"
     "                 example: --source diag:/dev/ttyUSB0\n"
     "  diag:FILE      a capture of the port's raw stream (.qmdl, .mi2log, .bin), played\n"
     "                 by the modem's own times; --speed (0 = as fast as the store takes\n"
     "                 it), --loop and --record apply, as to a replay\n"
     "                 example: --source diag:drive.qmdl --speed 0\n",
     diagClaims, diagParse, diagMake},
};

// Every form of every row, in order.
template <typename Each>
void forEachForm(Each&& each) {
    for (const SourceRow& row : kRows)
        for (const SourceForm& form : row.forms) each(form);
}

std::size_t formCount() {
    std::size_t count = 0;
    forEachForm([&count](const SourceForm&) { ++count; });
    return count;
}

// The forms joined as a sentence: "a, b or c", each as text(form) gives it.
template <typename Text>
std::string joinForms(Text&& text) {
    const std::size_t count = formCount();
    std::string out;
    std::size_t at = 0;
    forEachForm([&](const SourceForm& form) {
        if (at > 0) out += at + 1 == count ? " or " : ", ";
        out += text(form);
        ++at;
    });
    return out;
}

}  // namespace

std::span<const SourceRow> sourceTable() {
    return kRows;
}

std::string expectedForms() {
    return "expected " + joinForms([](const SourceForm& form) {
               return std::string(form.form) + std::string(form.note);
           });
}

std::string sourceFormNames() {
    return joinForms([](const SourceForm& form) { return std::string(form.form); });
}

}  // namespace pyx::sources
