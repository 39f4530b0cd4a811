// pyxonctl listen: brings a source up the way the viewer does (clear the configuration, push
// it, listen, ask for the SIM files) and prints every metric event as one JSON Lines record,
// flushed per line, until a duration or a count is reached or SIGINT/SIGTERM arrives.
#pragma once

#include "tools/Subcommand.h"

namespace pyx {

Subcommand addListenCommand(CLI::App& pyxonctl);

}  // namespace pyx
