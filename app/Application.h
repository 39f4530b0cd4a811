// The pyxon program: options, creation of the shared instances in their order, and the main
// loop of the window or of the headless mode.
#pragma once

namespace pyx {

// Runs the program; returns its exit status (2 for a usage error).
int runPyxon(int argc, char** argv);

}  // namespace pyx
