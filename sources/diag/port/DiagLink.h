// A live modem's DIAG port, end to end below velk: finds the port (or takes the one named),
// opens it, runs the start-up commands (version and build id, log ranges, one log mask per
// equipment id for exactly the codes the decoders take, event reports on), hands every metric
// event the stream decodes to the caller, and at stop turns masks and events off again. A port
// that goes away (unplugged, modem reset) is waited for and taken up again. Each fault is one
// line, said once until it clears.
#pragma once

#include <chrono>
#include <functional>
#include <memory>
#include <stop_token>
#include <string>
#include <string_view>

#include "sources/diag/stream/DiagStream.h"

namespace pyx::diag {

class DiagLink {
  public:
    struct Options {
        // The port: a tty (/dev/ttyUSB0) or a character device (/dev/wwan0qcdm0); empty: found
        // by its USB interface under sysfsRoot.
        std::string path;
        std::string sysfsRoot = "/sys";
        // Where to keep the raw byte stream read from the port (a .qmdl); empty: nowhere.
        std::string qmdlFile;
        std::chrono::milliseconds commandTimeout{2000};
        std::chrono::milliseconds retryEvery{3000};  // a missing or vanished port
        // One line per fault (no port, permission, busy, gone, no answer, mask refused), and
        // the session's notes (the modem's version and build id). Called on the link's thread.
        std::function<void(std::string_view line)> onLine;
    };

    explicit DiagLink(Options options);
    ~DiagLink();
    DiagLink(const DiagLink&) = delete;
    DiagLink& operator=(const DiagLink&) = delete;

    // Runs on the caller's thread until stop is requested: every decoded packet goes to
    // onEvents. Returns after logging was turned off again (where the port is still there).
    void run(const std::stop_token& stop, const DiagStream::EventSink& onEvents);

    // What the stream has seen so far (for the end-of-run summary).
    [[nodiscard]] StreamStats stats() const;

  private:
    struct State;
    std::unique_ptr<State> state_;
};

}  // namespace pyx::diag
