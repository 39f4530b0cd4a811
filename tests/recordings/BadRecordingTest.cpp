#include <gtest/gtest.h>
#include <sqlite3.h>

#include <filesystem>
#include <fstream>

#include "recordings/RecordingError.h"
#include "recordings/RecordingReader.h"
#include "recordings/RecordingWriter.h"
#include "tests/recordings/SampleEvents.h"
#include "tests/recordings/TempDir.h"

namespace {

using pyx::recordings::RecordingError;
using pyx::recordings::RecordingReader;
using pyx::recordings::RecordingWriter;
using pyx::testing::recordingOptions;
using pyx::testing::TempDir;

void write(const std::string& file, int events, std::size_t payloadSize = 12) {
    RecordingWriter writer(recordingOptions(file));
    for (int n = 0; n < events; ++n)
        writer.add(velk::kEventMetric, pyx::testing::sampleEvent(n, payloadSize));
}

void sql(const std::string& file, const char* statement) {
    sqlite3* db = nullptr;
    ASSERT_EQ(sqlite3_open(file.c_str(), &db), SQLITE_OK);
    ASSERT_EQ(sqlite3_exec(db, statement, nullptr, nullptr, nullptr), SQLITE_OK)
        << sqlite3_errmsg(db);
    sqlite3_close(db);
}

// The error opening file gives; fails the test when it opens.
RecordingError openError(const std::string& file) {
    try {
        const RecordingReader reader(file);
    } catch (const RecordingError& e) {
        return e;
    }
    ADD_FAILURE() << file << " opened";
    return RecordingError(RecordingError::Kind::Damaged, file, "opened");
}

TEST(BadRecording, AMissingFileIsNamedAsMissing) {
    const TempDir dir;
    const auto error = openError(dir.file("gone.pyxrec"));
    EXPECT_EQ(error.kind(), RecordingError::Kind::Missing);
    EXPECT_EQ(std::string(error.what()), dir.file("gone.pyxrec") + ": no such file");
}

TEST(BadRecording, ADirectoryIsRefused) {
    const TempDir dir;
    const auto error = openError(dir.path().string());
    EXPECT_EQ(error.kind(), RecordingError::Kind::NotAFile);
    EXPECT_EQ(std::string(error.what()), dir.path().string() + ": is a directory, not a recording");
}

TEST(BadRecording, AFileThatIsNotADatabaseIsRefused) {
    const TempDir dir;
    const std::string file = dir.file("notes.pyxrec");
    std::ofstream(file) << "these are notes about a drive, long enough to look like a file\n"
                        << std::string(200, 'x') << "\n";
    const auto error = openError(file);
    EXPECT_EQ(error.kind(), RecordingError::Kind::NotARecording);
    EXPECT_EQ(std::string(error.what()), file + ": not a Pyxon recording (not an SQLite database)");
}

TEST(BadRecording, AnEmptyFileIsRefused) {
    const TempDir dir;
    const std::string file = dir.file("empty.pyxrec");
    std::ofstream{file};
    EXPECT_EQ(openError(file).kind(), RecordingError::Kind::NotARecording);
}

TEST(BadRecording, AnotherSQLiteDatabaseIsRefused) {
    const TempDir dir;
    const std::string file = dir.file("other.db");
    sql(file, "CREATE TABLE t(x); INSERT INTO t VALUES(1);");
    const auto error = openError(file);
    EXPECT_EQ(error.kind(), RecordingError::Kind::NotARecording);
    EXPECT_EQ(std::string(error.what()),
              file + ": not a Pyxon recording (an SQLite database of something else)");
}

TEST(BadRecording, ANewerFormatVersionIsRefusedSayingWhichVersions) {
    const TempDir dir;
    const std::string file = dir.file("future.pyxrec");
    write(file, 3);
    sql(file, "PRAGMA user_version=7;");
    const auto error = openError(file);
    EXPECT_EQ(error.kind(), RecordingError::Kind::NewerFormat);
    EXPECT_EQ(std::string(error.what()),
              file +
                  ": written in format version 7 by a newer Pyxon; this one reads up to "
                  "version 2");
}

TEST(BadRecording, ATruncatedFileHandsOutTheEventsBeforeTheDamageAndSaysHowMany) {
    const TempDir dir;
    const std::string file = dir.file("cut.pyxrec");
    write(file, 3000, 40);
    const auto size = std::filesystem::file_size(file);
    std::filesystem::resize_file(file, size / 2);

    std::uint64_t handed = 0;
    std::int64_t expected = 0;
    try {
        const RecordingReader reader(file);
        reader.forEach({}, [&](pyx::recordings::RecordedEvent& event) {
            // What comes out before the damage is the recording's own prefix, in order.
            EXPECT_EQ(pyx::testing::sequenceOf(event.object), expected);
            ++expected;
            ++handed;
            return true;
        });
        FAIL() << "a truncated file read to the end";
    } catch (const RecordingError& e) {
        EXPECT_EQ(e.kind(), RecordingError::Kind::Damaged);
        EXPECT_EQ(e.eventsRead(), handed);
        const std::string what = e.what();
        EXPECT_TRUE(what.starts_with(file + ": damaged after event ") ||
                    what.starts_with(file + ": damaged at event "))
            << what;
    }
    EXPECT_GT(handed, 500u);
    EXPECT_LT(handed, 3000u);
}

TEST(BadRecording, AppendingToAFileThatIsNotARecordingIsRefused) {
    const TempDir dir;
    const std::string file = dir.file("notes.txt");
    std::ofstream(file) << std::string(300, 'n');
    auto options = recordingOptions(file);
    options.append = true;
    try {
        RecordingWriter writer(options);
        FAIL() << "appended to a text file";
    } catch (const RecordingError& e) {
        EXPECT_EQ(e.kind(), RecordingError::Kind::NotARecording);
    }
    EXPECT_EQ(std::filesystem::file_size(file), 300u);
}

TEST(BadRecording, RecordingIntoADirectoryIsRefused) {
    const TempDir dir;
    try {
        RecordingWriter writer(recordingOptions(dir.path().string()));
        FAIL() << "recorded into a directory";
    } catch (const RecordingError& e) {
        EXPECT_EQ(e.kind(), RecordingError::Kind::NotAFile);
    }
}

}  // namespace
