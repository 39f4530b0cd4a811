// pyxonctl: command-line tools around the metric store.
#include <string>
#include <vector>

#include "core/Log.h"
#include "tools/DecodeCommand.h"
#include "tools/ExportCommand.h"
#include "tools/InfoCommand.h"
#include "tools/ListenCommand.h"
#ifdef PYXON_HAVE_SCREEN_COMMAND
#include "tools/ScreenCommand.h"
#endif

// An exception that no subcommand expects ends the program through std::terminate, which names it.
int main(int argc, char** argv) {  // NOLINT(bugprone-exception-escape)
    CLI::App pyxonctl{
        "pyxonctl: tools around Pyxon's metric store.\n"
        "Example: echo '{\"kKeyMetricID\": 3986178, \"kKeyPayload\": "
        "\"08fbb0def7d32b12040814101e\"}' | pyxonctl decode\n"
        "Recordings: pyxonctl listen --source modem --record drive.pyxrec > /dev/null;\n"
        "  pyxonctl info drive.pyxrec; pyxonctl export drive.pyxrec --format csv > drive.csv\n"
        "stderr carries problems and summaries only; -v adds the system's own lines:\n"
        "  pyxonctl listen --count 20 -v > /dev/null",
        "pyxonctl"};
    pyxonctl.require_subcommand(1);
    pyxonctl.set_version_flag("--version", std::string("pyxonctl ") + PYXON_VERSION);
    bool verbose = false;
    pyxonctl.add_flag("-v,--verbose", verbose,
                      "Also print the system's own lines on stderr: the client's log of each "
                      "event (with its payload in hex), the store's arrival lines and the "
                      "start-up sequence. Before or after the subcommand.");
    std::vector<pyx::Subcommand> subcommands{
        pyx::addDecodeCommand(pyxonctl), pyx::addListenCommand(pyxonctl),
        pyx::addInfoCommand(pyxonctl), pyx::addExportCommand(pyxonctl)};
#ifdef PYXON_HAVE_SCREEN_COMMAND
    subcommands.push_back(pyx::addScreenCommand(pyxonctl));
#endif
    // -v is pyxonctl's own option, also taken after the subcommand's name.
    for (const auto& subcommand : subcommands) subcommand.parser->fallthrough();
    try {
        pyxonctl.parse(argc, argv);
    } catch (const CLI::ParseError& e) {
        // Help and version end with 0; every usage error with 2, as pyxon's do.
        const int status = pyxonctl.exit(e);
        return status == 0 ? 0 : 2;
    }
    // A command line keeps stderr for problems: the per-event lines are not even built.
    if (!verbose) {
        pyx::systemLogSink().mute(true);
        pyx::standardOutputSink().mute(true);
    }
    for (const auto& subcommand : subcommands) {
        if (subcommand.parser->parsed()) return subcommand.run();
    }
    return 1;
}
