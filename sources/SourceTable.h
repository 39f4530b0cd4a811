// The sources, one row each: the --source forms a row takes, its lines of the help, how it
// reads its text and how it makes its transport. The forms text of the refusals, the parser,
// the help and the factory (sources/SourceFactory.cpp) all read this one table, so a new source
// is one new row.
#pragma once

#include <memory>
#include <span>
#include <string>
#include <string_view>

#include "baseband/velk/Transport.h"
#include "sources/Source.h"

namespace pyx::sources {

// One --source form ("modem:N"), and what the refusals say after it, if anything.
struct SourceForm {
    std::string_view form;
    std::string_view note;  // " (N the number at the end of the modem's object path)"
};

struct SourceRow {
    SourceChoice::Kind kind;
    std::span<const SourceForm> forms;
    // Its lines of the help, each ending in a newline, with an example.
    std::string_view help;
    // Whether the text is one of this row's (it may still be refused by parse).
    bool (*claims)(std::string_view text);
    // Fills choice (kind and text are set) from the text; throws SourceError.
    void (*parse)(std::string_view text, SourceChoice& choice);
    // The transport; throws SourceError.
    std::shared_ptr<velk::client::Transport> (*make)(const SourceOptions& options);
};

// Every source, in the order the forms and the help list them.
[[nodiscard]] std::span<const SourceRow> sourceTable();

// "expected sim, modem, modem:N (N ...) or replay:FILE": every form with its note, for the
// refusals.
[[nodiscard]] std::string expectedForms();

}  // namespace pyx::sources
