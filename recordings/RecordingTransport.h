// A transport that records: it wraps the transport of any source and hands every event that
// source delivers to a RecordingWriter as well, unchanged and in arrival order, before passing
// it on. Commands go straight through. Nothing above it knows that a recording runs.
#pragma once

#include <memory>
#include <string>

#include "baseband/velk/Transport.h"
#include "recordings/RecordingWriter.h"

namespace pyx::recordings {

class RecordingTransport : public velk::client::Transport {
  public:
    RecordingTransport(std::shared_ptr<velk::client::Transport> source,
                       std::shared_ptr<RecordingWriter> writer);

    void connect(const std::string& clientName) override;
    velk::Result performCommand(const std::string& command, const Value& input,
                                Value* output) override;
    void startEvents(EventSink sink) override;
    void stopEvents() override;

  private:
    const std::shared_ptr<velk::client::Transport> source_;
    const std::shared_ptr<RecordingWriter> writer_;
};

}  // namespace pyx::recordings
