// What a failed SQLite call reports: its result code (extended), the operating system's errno
// where SQLite kept one, and SQLite's own message.
#pragma once

#include <stdexcept>
#include <string>

namespace pyx::recordings {

class SqliteError : public std::runtime_error {
  public:
    SqliteError(int code, int systemErrno, const std::string& message)
        : std::runtime_error(message), code_(code), systemErrno_(systemErrno) {}

    // The extended result code (SQLITE_FULL, SQLITE_IOERR_WRITE, ...).
    [[nodiscard]] int code() const { return code_; }
    // The primary result code (the low byte of the extended one).
    [[nodiscard]] int primaryCode() const { return code_ & 0xff; }
    [[nodiscard]] int systemErrno() const { return systemErrno_; }

  private:
    int code_;
    int systemErrno_;
};

}  // namespace pyx::recordings
