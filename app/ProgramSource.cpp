#include "app/ProgramSource.h"

#include <CLI/CLI.hpp>

#include <utility>

#include "baseband/velk/Client.h"

namespace pyx {

void SourceArgs::addTo(CLI::App& app) {
    app.add_option("--source", source,
                   "Where events come from: " + sources::sourceFormNames() + " (see below)")
        ->type_name("SOURCE")
        ->capture_default_str();
    app.add_option("--seed", seed, "Seed of the simulated baseband's drive")->capture_default_str();
    app.add_option("--speed", speed,
                   "Speed factor: the simulated baseband's events come this many times as often "
                   "(> 0); a replay or a diag capture divides the recorded timing by it (0 = as "
                   "fast as the store takes them)")
        ->check(CLI::NonNegativeNumber)
        ->capture_default_str();
    app.add_flag("--loop", loop,
                 "Replay or diag capture: start again at the end of the recording or capture");
    CLI::Option* recordOption =
        app.add_option("--record", record,
                       "Keep every event of this run in FILE (.pyxrec), raw and in order")
            ->type_name("FILE");
    app.add_flag("--append", append, "With --record: add a new session to an existing recording")
        ->needs(recordOption);
    app.add_option("--gps", gps,
                   "Positions from gpsd, at HOST:PORT or, alone, at 127.0.0.1:2947; kept in the "
                   "recording beside the events (e.g. --gps, --gps 192.168.1.5:2947)")
        ->type_name("[HOST:PORT]")
        ->expected(0, 1)
        ->default_str("");
    app.add_option("--qmdl", qmdl,
                   "With a live diag source (diag, diag:PORT): keep the raw stream the port sends "
                   "in FILE, a .qmdl that --source diag:FILE plays again (e.g. --source diag "
                   "--qmdl drive.qmdl)")
        ->type_name("FILE");
}

ProgramSource::ProgramSource(std::shared_ptr<velk::client::Transport> transport,
                             std::shared_ptr<recordings::RecordingWriter> recording,
                             std::unique_ptr<gps::GpsdClient> gps)
    : transport_(std::move(transport)), recording_(std::move(recording)), gps_(std::move(gps)) {}

ProgramSource::~ProgramSource() {
    close();
}

void ProgramSource::close() {
    gps_.reset();
    if (transport_) transport_->stopEvents();
    if (recording_) recording_->close();
    transport_.reset();
    recording_.reset();
}

ProgramSource openProgramSource(const SourceArgs& args, const std::string& programVersion,
                                std::function<void(bool damaged)> onEnd,
                                std::function<void(const gps::Fix&)> onFix) {
    std::optional<gps::GpsdAddress> gpsd;
    if (args.gps) {
        try {
            gpsd = gps::parseGpsdAddress(*args.gps);
        } catch (const gps::GpsdAddressError& e) {
            throw sources::SourceError(e.what());
        }
    }
    sources::SourceOptions options;
    options.choice = sources::parseSource(args.source);
    options.seed = args.seed;
    options.speed = args.speed;
    options.loop = args.loop;
    options.onEnd = std::move(onEnd);
    // A replay hands on the positions it recorded as a gpsd client does.
    options.onFix = onFix;
    if (args.qmdl) {
        if (args.qmdl->empty()) throw sources::SourceError("--qmdl: names no file");
        options.qmdlFile = *args.qmdl;  // makeTransport refuses it but for a live diag source
    }
    std::shared_ptr<velk::client::Transport> transport = sources::makeTransport(options);
    std::shared_ptr<recordings::RecordingWriter> recording;
    if (args.record) {
        auto recorded = sources::recordSource(
            std::move(transport), options,
            sources::RecordOptions{*args.record, args.append, programVersion});
        transport = std::move(recorded.transport);
        recording = std::move(recorded.writer);
    }
    velk::client::SetTransportFactory([transport] { return transport; });
    std::unique_ptr<gps::GpsdClient> gps;
    if (gpsd) {
        gps::GpsdClient::Options gpsOptions;
        gpsOptions.address = *gpsd;
        gpsOptions.onFix = [recording, onFix = std::move(onFix)](const gps::Fix& fix) {
            if (recording) recording->addFix(fix);
            if (onFix) onFix(fix);
        };
        gps = std::make_unique<gps::GpsdClient>(std::move(gpsOptions));
    }
    return ProgramSource(std::move(transport), std::move(recording), std::move(gps));
}

}  // namespace pyx
