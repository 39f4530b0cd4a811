#include <charconv>
#include <string>

#include "sources/Source.h"
#include "sources/modem/ModemManagerBaseband.h"
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
        throw SourceSpecError("--source " + std::string(whole) + ": '" + std::string(text) +
                              "' is not a modem number; " + std::string(kForms));
    return index;
}

}  // namespace

SourceSpec parseSourceSpec(std::string_view text) {
    SourceSpec spec;
    spec.text = std::string(text);
    if (text == "sim") return spec;
    if (text == "modem" || text.starts_with("modem:")) {
        spec.kind = SourceSpec::Kind::Modem;
        if (text != "modem") spec.modemIndex = modemIndex(text.substr(6), text);
        return spec;
    }
    if (text.starts_with("replay:")) {
        spec.kind = SourceSpec::Kind::Replay;
        spec.file = std::string(text.substr(7));
        if (spec.file.empty())
            throw SourceSpecError("--source replay: names no file; example: replay:drive.pyxrec");
        return spec;
    }
    throw SourceSpecError("--source '" + std::string(text) + "': " + std::string(kForms));
}

std::shared_ptr<velk::client::Transport> makeTransport(const SourceOptions& options) {
    switch (options.spec.kind) {
        case SourceSpec::Kind::Sim:
            try {
                return std::make_shared<sim::SimulatedBaseband>(
                    sim::SimulatedBaseband::Options{options.seed, options.speed, std::nullopt});
            } catch (const std::invalid_argument& e) {
                throw SourceSpecError(e.what());
            }
        case SourceSpec::Kind::Modem: {
            modem::ModemManagerBaseband::Options modem;
            modem.modemIndex = options.spec.modemIndex;
            return std::make_shared<modem::ModemManagerBaseband>(modem);
        }
        case SourceSpec::Kind::Replay:
            throw SourceSpecError("--source " + options.spec.text +
                                  ": this build has no replay source");
    }
    throw SourceSpecError("--source " + options.spec.text + ": unknown source");
}

std::string_view sourceHelp() {
    return "Sources (--source):\n"
           "  sim            the built-in simulated baseband (default); --seed and --speed apply\n"
           "                 example: --source sim --seed 7 --speed 20\n"
           "  modem          the first modem ModemManager knows, on the system D-Bus\n"
           "                 example: --source modem\n"
           "  modem:N        the modem whose object path ends in /Modem/N\n"
           "                 example: --source modem:0\n"
           "  replay:FILE    a recording made with --record; --speed and --loop apply\n"
           "                 example: --source replay:drive.pyxrec --speed 10\n";
}

}  // namespace pyx::sources
