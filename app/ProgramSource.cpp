#include "app/ProgramSource.h"

#include <utility>

#include "baseband/velk/Client.h"

namespace pyx {

ProgramSource::ProgramSource(std::shared_ptr<velk::client::Transport> transport,
                             std::shared_ptr<recordings::RecordingWriter> recording)
    : transport_(std::move(transport)), recording_(std::move(recording)) {}

ProgramSource::~ProgramSource() {
    close();
}

void ProgramSource::close() {
    if (transport_) transport_->stopEvents();
    if (recording_) recording_->close();
    transport_.reset();
    recording_.reset();
}

ProgramSource openProgramSource(sources::SourceOptions options,
                                const std::optional<std::string>& record, bool append,
                                const std::string& programVersion) {
    std::shared_ptr<velk::client::Transport> transport = sources::makeTransport(options);
    std::shared_ptr<recordings::RecordingWriter> recording;
    if (record) {
        auto recorded = sources::recordSource(
            std::move(transport), options, sources::RecordOptions{*record, append, programVersion});
        transport = std::move(recorded.transport);
        recording = std::move(recorded.writer);
    }
    velk::client::SetTransportFactory([transport] { return transport; });
    return ProgramSource(std::move(transport), std::move(recording));
}

}  // namespace pyx
