// pyxonctl screen: runs JSON Lines metric records through the store's intake, then answers
// what the category screen of one menu pair (or the third-level screen) would show, as one
// JSON object:
//   {"key":"LTE C-DRX","sections":[{"title":null,"rows":[{"text":"timestamp",
//    "detail":"2017-07-14 02:40:00 GMT"},...]}]}
// A title or text the screen leaves unset is null.
#pragma once

#include <iosfwd>
#include <string>

#include "tools/Subcommand.h"
#include "ui/TableController.h"

namespace pyx {

struct ScreenRequest {
    std::string group;     // firstSelection, e.g. "LTE"
    std::string category;  // seguedThroughRow, e.g. "C-DRX"
    bool third = false;    // the third-level screen instead of the category screen
};

// The JSON object for what controller shows, under key.
[[nodiscard]] std::string screenJson(const TableController& controller, const std::string& key);

// Feeds every line of in to a store without a baseband client, in order; reports each line
// that is not a record or that the store refuses on err (one line each) and goes on; then
// writes the screen's JSON object and a newline to out. Returns 0.
int runScreen(const ScreenRequest& request, std::istream& in, std::ostream& out, std::ostream& err);

// Adds "screen" to pyxonctl. The store's own standard-output lines go to stderr while it
// runs, so stdout carries only the JSON object.
Subcommand addScreenCommand(CLI::App& pyxonctl);

}  // namespace pyx
