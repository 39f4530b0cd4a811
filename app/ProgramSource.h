// The source a program runs on: the factory's transport for --source, wrapped in a recording
// for --record, and installed as the client's transport. pyxon and pyxonctl listen open their
// source the same way through here, and end it the same way: the source's events stop first
// (its thread posts to queues that static destruction takes down), then the recording closes
// and says what it holds.
#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>

#include "gps/GpsdClient.h"
#include "sources/Source.h"

namespace CLI {
class App;
}

namespace pyx {

// The options that choose a program's source and record it, the same in pyxon and pyxonctl
// listen.
struct SourceArgs {
    std::string source = "sim";
    std::uint64_t seed = 1;
    double speed = 1.0;
    bool loop = false;
    std::optional<std::string> record;
    bool append = false;
    // --gps [HOST:PORT]: positions from gpsd ("" = gpsd's default address).
    std::optional<std::string> gps;
    // --qmdl FILE: a live diag source keeps the raw stream of its port there.
    std::optional<std::string> qmdl;

    // Adds --source, --seed, --speed, --loop, --record, --append, --gps and --qmdl to app.
    void addTo(CLI::App& app);
};

class ProgramSource {
  public:
    ProgramSource(ProgramSource&& other) noexcept = default;
    ProgramSource& operator=(ProgramSource&&) = delete;
    ProgramSource(const ProgramSource&) = delete;
    ProgramSource& operator=(const ProgramSource&) = delete;
    // As close(): an early exit (an exception) ends the source too.
    ~ProgramSource();

    // Stops the positions and the source's events, then writes what is still queued for the
    // recording and closes it. Safe to call more than once.
    void close();

    [[nodiscard]] const std::shared_ptr<velk::client::Transport>& transport() const {
        return transport_;
    }
    // The gpsd client of --gps; null without.
    [[nodiscard]] const gps::GpsdClient* gps() const { return gps_.get(); }

  private:
    friend ProgramSource openProgramSource(const SourceArgs& args,
                                           const std::string& programVersion,
                                           std::function<void(bool damaged)> onEnd,
                                           std::function<void(const gps::Fix&)> onFix);
    ProgramSource(std::shared_ptr<velk::client::Transport> transport,
                  std::shared_ptr<recordings::RecordingWriter> recording,
                  std::unique_ptr<gps::GpsdClient> gps);

    std::shared_ptr<velk::client::Transport> transport_;
    std::shared_ptr<recordings::RecordingWriter> recording_;  // for --record
    std::unique_ptr<gps::GpsdClient> gps_;                    // for --gps
};

// Opens the source args name and sets it as velk's transport factory; with --gps, starts the
// gpsd client, whose fixes go to the recording (with --record) and to onFix (on the client's
// thread). A replay hands its recorded fixes to onFix at their times (on its thread). onEnd: called
// when a replay without --loop reaches the end of its recording (see SourceOptions::onEnd). Throws
// sources::SourceError with one line saying what is wrong (--qmdl without a live diag source among
// it).
[[nodiscard]] ProgramSource openProgramSource(const SourceArgs& args,
                                              const std::string& programVersion,
                                              std::function<void(bool damaged)> onEnd = {},
                                              std::function<void(const gps::Fix&)> onFix = {});

}  // namespace pyx
