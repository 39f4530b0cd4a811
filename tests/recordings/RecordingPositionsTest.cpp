// GPS fixes kept beside the events: written in their order among them, read back exactly, told
// by the summary; files of the first format, which had none, still open and gain them when a
// session is appended.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "gps/Fix.h"
#include "recordings/RecordingReader.h"
#include "recordings/RecordingWriter.h"
#include "recordings/SqliteDatabase.h"
#include "tests/recordings/SampleEvents.h"
#include "tests/recordings/TempDir.h"

namespace {

using pyx::gps::Fix;
using pyx::gps::FixMode;
using pyx::recordings::RecordingReader;
using pyx::recordings::RecordingWriter;
using pyx::recordings::SqliteDatabase;
using pyx::testing::sampleEvent;
using pyx::testing::TempDir;

Fix fixAt(int n) {
    Fix fix;
    fix.timeNs = 1'795'000'000'000'000'000 + n * 1'000'000'000LL;
    fix.receivedNs = fix.timeNs + 300'000'000;
    fix.mode = n % 2 == 0 ? FixMode::ThreeD : FixMode::TwoD;
    fix.lat = 48.8566 + n * 0.0001;
    fix.lon = 2.3522 - n * 0.0002;
    if (fix.mode == FixMode::ThreeD) fix.altM = 35.5;
    fix.speedMps = 5.25;
    if (n > 0) fix.trackDeg = 45.0;
    fix.horizontalErrorM = 3.5;
    return fix;
}

std::vector<Fix> positionsOf(const std::string& file) {
    std::vector<Fix> fixes;
    RecordingReader(file).forEachPosition([&](const Fix& fix) {
        fixes.push_back(fix);
        return true;
    });
    return fixes;
}

TEST(RecordingPositions, FixesReadBackExactlyWithTheirSummary) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    std::vector<Fix> written;
    {
        RecordingWriter writer(pyx::testing::recordingOptions(file, false));
        for (int n = 0; n < 50; ++n) {
            writer.add(velk::kEventMetric, sampleEvent(n));
            if (n % 5 == 0) {
                written.push_back(fixAt(n / 5));
                writer.addFix(written.back());
            }
        }
        writer.close();
        EXPECT_EQ(writer.counts().recorded, 50u);
        EXPECT_EQ(writer.counts().positions, 10u);
    }
    EXPECT_EQ(positionsOf(file), written);
    const auto summary = RecordingReader(file).summary();
    EXPECT_EQ(summary.formatVersion, 2);
    EXPECT_EQ(summary.events, 50u);
    ASSERT_TRUE(summary.positions);
    EXPECT_EQ(summary.positions->count, 10u);
    EXPECT_EQ(summary.positions->firstNs, written.front().timeNs);
    EXPECT_EQ(summary.positions->lastNs, written.back().timeNs);
    EXPECT_DOUBLE_EQ(summary.positions->south, written.front().lat);
    EXPECT_DOUBLE_EQ(summary.positions->north, written.back().lat);
    EXPECT_DOUBLE_EQ(summary.positions->west, written.back().lon);
    EXPECT_DOUBLE_EQ(summary.positions->east, written.front().lon);
}

TEST(RecordingPositions, ARecordingWithoutFixesHasNoPositions) {
    const TempDir dir;
    const std::string file = dir.file("drive.pyxrec");
    {
        RecordingWriter writer(pyx::testing::recordingOptions(file, false));
        writer.add(velk::kEventMetric, sampleEvent(1));
    }
    EXPECT_TRUE(positionsOf(file).empty());
    EXPECT_FALSE(RecordingReader(file).summary().positions);
}

TEST(RecordingPositions, AFirstFormatFileOpensAndGainsPositionsWhenASessionIsAppended) {
    const TempDir dir;
    const std::string file = dir.file("old.pyxrec");
    {
        RecordingWriter writer(pyx::testing::recordingOptions(file, false));
        for (int n = 0; n < 10; ++n) writer.add(velk::kEventMetric, sampleEvent(n));
    }
    {
        // As the first format wrote it: no positions table, version 1.
        SqliteDatabase db(file, SqliteDatabase::Mode::ReadWrite);
        db.execute(
            "DROP TABLE positions; PRAGMA user_version=1; "
            "UPDATE meta SET value=1 WHERE key='format_version';");
    }
    {
        const RecordingReader old(file);
        const auto summary = old.summary();
        EXPECT_EQ(summary.formatVersion, 1);
        EXPECT_EQ(summary.events, 10u);
        EXPECT_FALSE(summary.positions);
        EXPECT_EQ(old.forEachPosition([](const Fix&) { return true; }), 0u);
    }
    {
        RecordingWriter writer(pyx::testing::recordingOptions(file, true));
        writer.add(velk::kEventMetric, sampleEvent(10));
        writer.addFix(fixAt(1));
    }
    const auto summary = RecordingReader(file).summary();
    EXPECT_EQ(summary.formatVersion, 2);
    EXPECT_EQ(summary.events, 11u);
    EXPECT_EQ(summary.sessions.size(), 2u);
    EXPECT_EQ(positionsOf(file), std::vector<Fix>{fixAt(1)});
}

}  // namespace
