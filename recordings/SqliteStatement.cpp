#include "recordings/SqliteStatement.h"

#include <sqlite3.h>

#include "recordings/SqliteDatabase.h"

namespace pyx::recordings {

void SqliteStatement::Finalize::operator()(sqlite3_stmt* statement) const {
    sqlite3_finalize(statement);
}

SqliteStatement::SqliteStatement(sqlite3_stmt* statement) : statement_(statement) {}

namespace {

void check(sqlite3_stmt* statement, int code) {
    if (code != SQLITE_OK)
        throw SqliteDatabase::errorFor(sqlite3_db_handle(statement), code, "bind");
}

}  // namespace

void SqliteStatement::bindNull(int index) {
    check(statement_.get(), sqlite3_bind_null(statement_.get(), index));
}

void SqliteStatement::bind(int index, std::int64_t value) {
    check(statement_.get(), sqlite3_bind_int64(statement_.get(), index, value));
}

void SqliteStatement::bind(int index, double value) {
    check(statement_.get(), sqlite3_bind_double(statement_.get(), index, value));
}

void SqliteStatement::bind(int index, std::string_view text) {
    check(statement_.get(), sqlite3_bind_text64(statement_.get(), index, text.data(), text.size(),
                                                SQLITE_STATIC, SQLITE_UTF8));
}

void SqliteStatement::bindBlob(int index, std::span<const std::uint8_t> bytes) {
    // An empty blob is still a blob, not NULL: SQLite needs a non-null pointer for that.
    static const std::uint8_t kNothing = 0;
    check(statement_.get(),
          sqlite3_bind_blob64(statement_.get(), index, bytes.empty() ? &kNothing : bytes.data(),
                              bytes.size(), SQLITE_STATIC));
}

bool SqliteStatement::step() {
    const int code = sqlite3_step(statement_.get());
    if (code == SQLITE_ROW) return true;
    if (code == SQLITE_DONE) return false;
    throw SqliteDatabase::errorFor(sqlite3_db_handle(statement_.get()), code, "step");
}

void SqliteStatement::reset() {
    sqlite3_reset(statement_.get());
}

bool SqliteStatement::isNull(int column) const {
    return sqlite3_column_type(statement_.get(), column) == SQLITE_NULL;
}

std::int64_t SqliteStatement::integer(int column) const {
    return sqlite3_column_int64(statement_.get(), column);
}

double SqliteStatement::real(int column) const {
    return sqlite3_column_double(statement_.get(), column);
}

std::string SqliteStatement::text(int column) const {
    const auto* text = sqlite3_column_text(statement_.get(), column);
    const int size = sqlite3_column_bytes(statement_.get(), column);
    return text ? std::string(reinterpret_cast<const char*>(text), static_cast<std::size_t>(size))
                : std::string();
}

std::span<const std::uint8_t> SqliteStatement::blob(int column) const {
    const auto* data =
        static_cast<const std::uint8_t*>(sqlite3_column_blob(statement_.get(), column));
    const int size = sqlite3_column_bytes(statement_.get(), column);
    return data ? std::span<const std::uint8_t>(data, static_cast<std::size_t>(size))
                : std::span<const std::uint8_t>();
}

}  // namespace pyx::recordings
