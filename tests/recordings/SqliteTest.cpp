#include <gtest/gtest.h>

#include <string>
#include <utility>

#include "recordings/SqliteDatabase.h"
#include "recordings/SqliteStatement.h"
#include "tests/recordings/TempDir.h"

namespace {

using pyx::recordings::SqliteDatabase;
using pyx::recordings::SqliteError;
using pyx::recordings::SqliteStatement;
using pyx::testing::TempDir;

TEST(Sqlite, AStatementNamesItsConnectionsMessageAfterTheDatabaseObjectMoved) {
    const TempDir dir;
    SqliteDatabase first(dir.file("t.db"), SqliteDatabase::Mode::ReadWriteCreate);
    first.execute("CREATE TABLE t(x INTEGER UNIQUE)");
    first.execute("INSERT INTO t(x) VALUES(1)");
    SqliteStatement insert = first.prepare("INSERT INTO t(x) VALUES(?)");
    const SqliteDatabase moved(std::move(first));
    insert.bind(1, std::int64_t{1});
    try {
        static_cast<void>(insert.step());
        FAIL() << "a duplicate went in";
    } catch (const SqliteError& e) {
        EXPECT_EQ(std::string(e.what()), "step: UNIQUE constraint failed: t.x");
    }
}

}  // namespace
