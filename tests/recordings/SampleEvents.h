// Events for the recording tests: numbered metric events with a few keys of every kind, so
// that what reads back can be compared value for value.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "baseband/velk/Names.h"
#include "core/Value.h"
#include "recordings/RecordingReader.h"
#include "recordings/RecordingWriter.h"

namespace pyx::testing {

struct StreamEvent {
    std::string stream;
    Value object;
    friend bool operator==(const StreamEvent&, const StreamEvent&) = default;
};

// A writer's options for a test recording at file: a session of the simulated source.
inline recordings::RecordingWriter::Options recordingOptions(const std::string& file,
                                                             bool append = false) {
    recordings::RecordingWriter::Options options;
    options.path = file;
    options.append = append;
    options.session.programVersion = "0.1.0";
    options.session.source = "sim";
    options.session.host = "testhost";
    return options;
}

// Event number n: a metric event whose trigger reference is n (kinds rotate over three IDs).
inline Value sampleEvent(std::int64_t n, std::size_t payloadSize = 12) {
    static constexpr std::int64_t kKinds[] = {0x3C4E04, 0x3CD302, 0x3C4E01};
    Bytes payload(payloadSize);
    for (std::size_t i = 0; i < payload.size(); ++i)
        payload[i] = static_cast<std::uint8_t>(n * 7 + static_cast<std::int64_t>(i));
    return Value(Dict{{velk::kKeyMetricID, Value(kKinds[n % 3])},
                      {velk::kKeyPayload, Value(std::move(payload))},
                      {velk::kKeyTriggerRef, Value(n)},
                      {velk::kKeyProfileID, Value(std::int64_t{4})}});
}

inline std::int64_t sequenceOf(const Value& event) {
    return event.asDict().find(velk::kKeyTriggerRef)->asInt();
}

// Everything a recording hands out, in order.
inline std::vector<recordings::RecordedEvent> readAll(
    const std::string& file, recordings::RecordingReader::Filter filter = {}) {
    std::vector<recordings::RecordedEvent> events;
    const recordings::RecordingReader reader(file);
    reader.forEach(filter, [&](recordings::RecordedEvent& event) {
        events.push_back(event);
        return true;
    });
    return events;
}

}  // namespace pyx::testing
