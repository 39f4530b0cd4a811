#include "recordings/SqliteDatabase.h"

#include <sqlite3.h>

#include "recordings/SqliteStatement.h"

namespace pyx::recordings {

void SqliteDatabase::Close::operator()(sqlite3* db) const {
    sqlite3_close_v2(db);
}

SqliteDatabase::SqliteDatabase(const std::string& path, Mode mode, int busyTimeoutMs) {
    int flags = SQLITE_OPEN_NOMUTEX;
    switch (mode) {
        case Mode::ReadOnly:
            flags |= SQLITE_OPEN_READONLY;
            break;
        case Mode::ReadWrite:
            flags |= SQLITE_OPEN_READWRITE;
            break;
        case Mode::ReadWriteCreate:
            flags |= SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE;
            break;
    }
    sqlite3* raw = nullptr;
    const int code = sqlite3_open_v2(path.c_str(), &raw, flags, nullptr);
    db_.reset(raw);  // a handle comes back even on failure, and is closed here
    if (code != SQLITE_OK) throw errorFor(code, "open");
    sqlite3_extended_result_codes(raw, 1);
    sqlite3_busy_timeout(raw, busyTimeoutMs);
}

SqliteDatabase::SqliteDatabase(SqliteDatabase&&) noexcept = default;
SqliteDatabase& SqliteDatabase::operator=(SqliteDatabase&&) noexcept = default;
SqliteDatabase::~SqliteDatabase() = default;

SqliteError SqliteDatabase::errorFor(int code, const std::string& what) const {
    return errorFor(db_.get(), code, what);
}

SqliteError SqliteDatabase::errorFor(sqlite3* db, int code, const std::string& what) {
    const char* message = db ? sqlite3_errmsg(db) : sqlite3_errstr(code);
    const int systemErrno = db ? sqlite3_system_errno(db) : 0;
    return SqliteError(code, systemErrno, what + ": " + (message ? message : sqlite3_errstr(code)));
}

void SqliteDatabase::execute(const std::string& sql) {
    const int code = sqlite3_exec(db_.get(), sql.c_str(), nullptr, nullptr, nullptr);
    if (code != SQLITE_OK) throw errorFor(code, sql.substr(0, sql.find_first_of(" ;")));
}

SqliteStatement SqliteDatabase::prepare(const std::string& sql) {
    sqlite3_stmt* statement = nullptr;
    const int code = sqlite3_prepare_v2(db_.get(), sql.c_str(), static_cast<int>(sql.size()),
                                        &statement, nullptr);
    if (code != SQLITE_OK) {
        sqlite3_finalize(statement);
        throw errorFor(code, "prepare");
    }
    return SqliteStatement(statement);
}

long long SqliteDatabase::queryInteger(const std::string& sql) {
    SqliteStatement statement = prepare(sql);
    if (!statement.step()) throw SqliteError(SQLITE_ERROR, 0, sql + ": no row");
    return statement.integer(0);
}

}  // namespace pyx::recordings
