#include "sources/SourceTable.h"

#include <charconv>
#include <stdexcept>
#include <string>
#include <utility>

#include "baseband/VelkWrapper.h"
#include "core/MainQueue.h"
#include "recordings/RecordingError.h"
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
        replayOptions.backlog = options.backlog ? options.backlog : storeBacklog;
        return std::make_shared<replay::ReplayTransport>(std::move(replayOptions));
    } catch (const recordings::RecordingError& e) {
        throw SourceError(std::string("--source replay: ") + e.what());
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
