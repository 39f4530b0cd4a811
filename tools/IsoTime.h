// Times of recordings as text: ISO 8601 in UTC with nanoseconds, "2026-11-23T19:05:50.123456789Z",
// the form info and export write, and the forms --from and --to read.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace pyx {

// Appends ns (since 1970, UTC) as "YYYY-MM-DDTHH:MM:SS.nnnnnnnnnZ".
void appendIsoTime(std::string& out, std::int64_t ns);
[[nodiscard]] std::string isoTime(std::int64_t ns);

// Why a text was not read as a time.
enum class IsoTimeRefusal {
    NotATime,    // not of the forms below, or no such date (2026-02-31), hour or zone
    OutOfRange,  // a time, but outside what ns since 1970 in 64 bits can hold (isoTimeRange)
};

// "YYYY-MM-DD", "YYYY-MM-DDTHH:MM", "YYYY-MM-DDTHH:MM:SS" with an optional fraction of up to
// nine digits, a blank instead of the T, and "Z", "+HH:MM" or "-HH:MM" at the end (no zone:
// UTC). Nothing for anything else, with the reason in refusal when one is given.
[[nodiscard]] std::optional<std::int64_t> parseIsoTime(std::string_view text,
                                                       IsoTimeRefusal* refusal = nullptr);

// The first and the last time a recording can hold, "... to ...".
[[nodiscard]] std::string isoTimeRange();

}  // namespace pyx
