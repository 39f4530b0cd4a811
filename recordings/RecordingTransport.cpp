#include "recordings/RecordingTransport.h"

#include <utility>

namespace pyx::recordings {

RecordingTransport::RecordingTransport(std::shared_ptr<velk::client::Transport> source,
                                       std::shared_ptr<RecordingWriter> writer)
    : source_(std::move(source)), writer_(std::move(writer)) {}

void RecordingTransport::connect(const std::string& clientName) {
    source_->connect(clientName);
}

velk::Result RecordingTransport::performCommand(const std::string& command, const Value& input,
                                                Value* output) {
    return source_->performCommand(command, input, output);
}

void RecordingTransport::startEvents(EventSink sink) {
    source_->startEvents(
        [writer = writer_, sink = std::move(sink)](const std::string& event, Value object) {
            writer->add(event, object);
            sink(event, std::move(object));
        });
}

void RecordingTransport::stopEvents() {
    source_->stopEvents();
}

}  // namespace pyx::recordings
