// One prepared SQLite statement, finalized when the object goes.
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "recordings/SqliteError.h"

struct sqlite3_stmt;

namespace pyx::recordings {

class SqliteStatement {
  public:
    // Takes statement over; errors name its connection's message.
    explicit SqliteStatement(sqlite3_stmt* statement);

    // Parameters count from 1, as in SQLite. Texts and blobs are not copied: they must stay
    // as they are until the statement has run (step) or is bound anew.
    void bindNull(int index);
    void bind(int index, std::int64_t value);
    void bind(int index, double value);
    void bind(int index, std::string_view text);
    void bindBlob(int index, std::span<const std::uint8_t> bytes);
    // The value, or NULL when there is none.
    template <typename T>
    void bindOrNull(int index, const std::optional<T>& value) {
        if (value) {
            bind(index, *value);
        } else {
            bindNull(index);
        }
    }

    // Runs to the next row: true when there is one, false when done. Throws SqliteError.
    bool step();
    // Ready to run again; the parameters keep their values until bound anew.
    void reset();

    [[nodiscard]] bool isNull(int column) const;
    [[nodiscard]] std::int64_t integer(int column) const;
    [[nodiscard]] double real(int column) const;
    [[nodiscard]] std::string text(int column) const;
    // Valid until the next step or reset.
    [[nodiscard]] std::span<const std::uint8_t> blob(int column) const;

  private:
    struct Finalize {
        void operator()(sqlite3_stmt* statement) const;
    };
    std::unique_ptr<sqlite3_stmt, Finalize> statement_;
};

}  // namespace pyx::recordings
