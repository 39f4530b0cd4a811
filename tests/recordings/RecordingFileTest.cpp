#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <thread>

#include "core/Log.h"
#include "recordings/RecordCodec.h"
#include "recordings/RecordingError.h"
#include "recordings/RecordingReader.h"
#include "recordings/RecordingWriter.h"
#include "tests/recordings/SampleEvents.h"
#include "tests/recordings/TempDir.h"

namespace {

using pyx::Array;
using pyx::Bytes;
using pyx::Dict;
using pyx::Value;
using pyx::recordings::RecordingError;
using pyx::recordings::RecordingReader;
using pyx::recordings::RecordingWriter;
using pyx::testing::readAll;
using pyx::testing::sampleEvent;
using pyx::testing::TempDir;

// Of a session with a seed and a speed, which read back.
RecordingWriter::Options optionsFor(const std::string& file, bool append = false) {
    auto options = pyx::testing::recordingOptions(file, append);
    options.session.seed = 7;
    options.session.speed = 20.0;
    return options;
}

TEST(RecordingFile, WhatIsWrittenReadsBackAsTheSameEventsInTheSameOrder) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    std::vector<pyx::testing::StreamEvent> written;
    {
        RecordingWriter writer(optionsFor(file));
        for (std::int64_t n = 0; n < 1000; ++n) {
            const char* stream = n % 10 == 0 ? velk::kEventTrigger : velk::kEventMetric;
            written.push_back({stream, sampleEvent(n)});
            writer.add(stream, sampleEvent(n));
        }
    }
    const auto events = readAll(file);
    ASSERT_EQ(events.size(), written.size());
    for (std::size_t i = 0; i < events.size(); ++i) {
        EXPECT_EQ(events[i].stream, written[i].stream) << i;
        EXPECT_EQ(events[i].object, written[i].object) << i;
        if (i > 0) {
            EXPECT_GT(events[i].id, events[i - 1].id);
            EXPECT_GE(events[i].monoNs, events[i - 1].monoNs);
        }
    }
}

TEST(RecordingFile, EventsOfEveryShapeReadBackExactly) {
    const std::vector<Value> shapes{
        Value(),
        Value(std::int64_t{42}),
        Value(Dict{}),
        Value(Dict{{velk::kKeyMetricID, Value(std::uint64_t{0x3C4E04})},
                   {velk::kKeyPayload, Value(Bytes{})}}),
        Value(Dict{{velk::kKeyPayload, Value(Bytes{1, 2, 3})},
                   {velk::kKeyMetricID, Value("0x3C4E04")}}),
        Value(Dict{{velk::kKeyMetricID, Value(std::numeric_limits<std::uint64_t>::max())},
                   {velk::kKeyPayload, Value("not bytes")}}),
        Value(Dict{{"nested", Value(Array{Value(true), Value(false), Value(-1.5f),
                                          Value(std::numeric_limits<std::int64_t>::min()),
                                          Value(Dict{{"k", Value(Bytes{0xff})}})})},
                   {velk::kKeyMetricID, Value(std::int64_t{-5})}}),
    };
    const TempDir dir;
    const std::string file = dir.file("shapes.pyxrec");
    {
        RecordingWriter writer(optionsFor(file));
        for (const Value& shape : shapes) writer.add(velk::kEventMetric, shape);
    }
    const auto events = readAll(file);
    ASSERT_EQ(events.size(), shapes.size());
    for (std::size_t i = 0; i < shapes.size(); ++i) EXPECT_EQ(events[i].object, shapes[i]) << i;
}

TEST(RecordingFile, AStoredFormThatIsCutShortIsRefusedWithAReason) {
    pyx::recordings::EncodedRecord encoded;
    pyx::recordings::encodeRecord(sampleEvent(3), encoded);
    const Bytes payload(12, 1);
    for (std::size_t size = 0; size < encoded.form.size(); ++size) {
        EXPECT_THROW(
            static_cast<void>(pyx::recordings::decodeRecord(std::span(encoded.form.data(), size),
                                                            encoded.metricID, std::span(payload))),
            pyx::recordings::RecordCodecError)
            << size;
    }
}

TEST(RecordingFile, AnExistingFileIsRefusedWithoutAppend) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    { RecordingWriter writer(optionsFor(file)); }
    try {
        RecordingWriter writer(optionsFor(file));
        FAIL() << "an existing file was accepted";
    } catch (const RecordingError& e) {
        EXPECT_EQ(e.kind(), RecordingError::Kind::Exists);
        EXPECT_EQ(std::string(e.what()),
                  file +
                      ": exists already; give --append to add a session to it, or choose "
                      "another name");
    }
}

TEST(RecordingFile, AppendAddsASessionAfterTheEventsOfTheEarlierOne) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    {
        RecordingWriter writer(optionsFor(file));
        for (std::int64_t n = 0; n < 10; ++n) writer.add(velk::kEventMetric, sampleEvent(n));
    }
    {
        auto options = optionsFor(file, true);
        options.session.source = "replay:old.pyxrec";
        options.session.seed.reset();
        RecordingWriter writer(options);
        for (std::int64_t n = 10; n < 25; ++n) writer.add(velk::kEventMetric, sampleEvent(n));
    }
    const auto events = readAll(file);
    ASSERT_EQ(events.size(), 25u);
    for (std::size_t i = 0; i < events.size(); ++i) {
        EXPECT_EQ(pyx::testing::sequenceOf(events[i].object), static_cast<std::int64_t>(i));
        EXPECT_EQ(events[i].session, i < 10 ? 1 : 2);
    }
    const auto summary = RecordingReader(file).summary();
    ASSERT_EQ(summary.sessions.size(), 2u);
    EXPECT_EQ(summary.sessions[0].source, "sim");
    EXPECT_EQ(summary.sessions[0].seed, 7);
    EXPECT_EQ(summary.sessions[1].source, "replay:old.pyxrec");
    EXPECT_FALSE(summary.sessions[1].seed);
    EXPECT_EQ(summary.sessions[1].host, "testhost");
    EXPECT_LE(summary.sessions[0].startNs, summary.sessions[1].startNs);
}

TEST(RecordingFile, TheSummaryCountsEventsAndKindsAndGivesTheFirstAndLastTime) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    {
        RecordingWriter writer(optionsFor(file));
        for (std::int64_t n = 0; n < 30; ++n) writer.add(velk::kEventMetric, sampleEvent(n));
        writer.add(velk::kEventTrigger, Value(Dict{{velk::kKeyTriggerID, Value(std::int64_t{1})}}));
    }
    const auto summary = RecordingReader(file).summary();
    EXPECT_EQ(summary.events, 31u);
    EXPECT_EQ(summary.formatVersion, 2);
    EXPECT_EQ(summary.kinds, (std::map<std::int64_t, std::uint64_t>{
                                 {0x3C4E01, 10}, {0x3C4E04, 10}, {0x3CD302, 10}}));
    ASSERT_TRUE(summary.firstNs && summary.lastNs);
    EXPECT_LE(*summary.firstNs, *summary.lastNs);
}

TEST(RecordingFile, AFilterHandsOutOnlyTheKindsStreamAndTimesAskedFor) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    {
        RecordingWriter writer(optionsFor(file));
        for (std::int64_t n = 0; n < 30; ++n)
            writer.add(n % 2 ? velk::kEventMetric : velk::kEventTrigger, sampleEvent(n));
    }
    const auto all = readAll(file);
    RecordingReader::Filter filter;
    filter.metricIDs = {0x3C4E04};
    filter.stream = velk::kEventMetric;
    filter.fromNs = all[5].wallNs;
    filter.toNs = all[25].wallNs;
    const auto some = readAll(file, filter);
    ASSERT_FALSE(some.empty());
    for (const auto& event : some) {
        EXPECT_EQ(event.object.asDict().find(velk::kKeyMetricID)->asInt(), 0x3C4E04);
        EXPECT_EQ(event.stream, velk::kEventMetric);
        EXPECT_GE(event.wallNs, all[5].wallNs);
        EXPECT_LE(event.wallNs, all[25].wallNs);
    }
    const auto expected = std::count_if(all.begin(), all.end(), [&](const auto& e) {
        return e.stream == velk::kEventMetric && e.wallNs >= all[5].wallNs &&
               e.wallNs <= all[25].wallNs &&
               e.object.asDict().find(velk::kKeyMetricID)->asInt() == 0x3C4E04;
    });
    EXPECT_EQ(static_cast<std::ptrdiff_t>(some.size()), expected);
}

TEST(RecordingFile, AFullQueueDropsEventsCountsThemAndSaysSoOnce) {
    const pyx::CapturedLines log(pyx::systemLogSink());
    const TempDir dir;
    auto options = optionsFor(dir.file("drive.pyxrec"));
    options.queueCapacity = 4;
    RecordingWriter writer(options);
    for (std::int64_t n = 0; n < 20000; ++n) writer.add(velk::kEventMetric, sampleEvent(n));
    writer.close();
    const auto counts = writer.counts();
    EXPECT_EQ(counts.recorded + counts.dropped, 20000u);
    EXPECT_GT(counts.dropped, 0u);
    const auto lines = log.lines();
    EXPECT_EQ(std::count_if(lines.begin(), lines.end(),
                            [](const std::string& line) {
                                return line.find("cannot keep up") != std::string::npos;
                            }),
              1);
    EXPECT_EQ(readAll(options.path).size(), counts.recorded);
}

TEST(RecordingFile, FlushMakesEverythingAddedSoFarReadableWhileTheRecordingGoesOn) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    auto options = optionsFor(file);
    options.commitInterval = std::chrono::hours(1);
    RecordingWriter writer(options);
    for (std::int64_t n = 0; n < 50; ++n) writer.add(velk::kEventMetric, sampleEvent(n));
    writer.flush();
    EXPECT_EQ(readAll(file).size(), 50u);
    EXPECT_EQ(writer.counts().recorded, 50u);
}

}  // namespace
