// One open SQLite database connection, closed when the object goes. A thin layer of our own:
// only what the recordings need (open, run statements, prepare).
#pragma once

#include <memory>
#include <string>

#include "recordings/SqliteError.h"

struct sqlite3;

namespace pyx::recordings {

class SqliteStatement;

class SqliteDatabase {
  public:
    enum class Mode { ReadOnly, ReadWrite, ReadWriteCreate };

    // Opens path; throws SqliteError when SQLite cannot. A busy database is waited for at
    // most busyTimeoutMs before a call fails with SQLITE_BUSY.
    SqliteDatabase(const std::string& path, Mode mode, int busyTimeoutMs = 2000);
    SqliteDatabase(SqliteDatabase&&) noexcept;
    SqliteDatabase& operator=(SqliteDatabase&&) noexcept;
    ~SqliteDatabase();

    // Runs one or more statements that return no rows of interest.
    void execute(const std::string& sql);
    [[nodiscard]] SqliteStatement prepare(const std::string& sql);
    // The single integer a query such as "PRAGMA user_version" answers.
    [[nodiscard]] long long queryInteger(const std::string& sql);

    [[nodiscard]] sqlite3* handle() const { return db_.get(); }
    // A SqliteError for result code, with the connection's message and errno.
    [[nodiscard]] SqliteError errorFor(int code, const std::string& what) const;
    // The same for any connection (db may be null: the code's own text then).
    [[nodiscard]] static SqliteError errorFor(sqlite3* db, int code, const std::string& what);

  private:
    struct Close {
        void operator()(sqlite3* db) const;
    };
    std::unique_ptr<sqlite3, Close> db_;
};

}  // namespace pyx::recordings
