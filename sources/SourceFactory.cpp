#include <unistd.h>

#include <climits>
#include <string>

#include "recordings/RecordingError.h"
#include "recordings/RecordingTransport.h"
#include "sources/Source.h"
#include "sources/SourceTable.h"

namespace pyx::sources {

SourceChoice parseSource(std::string_view text) {
    for (const SourceRow& row : sourceTable()) {
        if (!row.claims(text)) continue;
        SourceChoice choice;
        choice.kind = row.kind;
        choice.text = std::string(text);
        row.parse(text, choice);
        return choice;
    }
    throw SourceError("--source '" + std::string(text) + "': " + expectedForms());
}

std::shared_ptr<velk::client::Transport> makeTransport(const SourceOptions& options) {
    if (!options.qmdlFile.empty() && !isLiveDiag(options.choice))
        throw SourceError("--qmdl " + options.qmdlFile +
                          ": only with a live diag source (--source diag or diag:PORT), not "
                          "with --source " +
                          options.choice.text);
    for (const SourceRow& row : sourceTable())
        if (row.kind == options.choice.kind) return row.make(options);
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
    if (options.choice.kind != SourceChoice::Kind::Modem && !isLiveDiag(options.choice))
        writer.session.speed = options.speed;
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
    // Built once, on first use, from the table.
    static const std::string help = [] {
        std::string text = "Sources (--source):\n";
        for (const SourceRow& row : sourceTable()) text += row.help;
        return text;
    }();
    return help;
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
