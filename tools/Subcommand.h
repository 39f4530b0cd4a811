// A subcommand of pyxonctl: its CLI11 parser and what runs when it was chosen.
#pragma once

#include <functional>

#include <CLI/CLI.hpp>

namespace pyx {

struct Subcommand {
    CLI::App* parser;
    std::function<int()> run;  // the process's exit code
};

}  // namespace pyx
