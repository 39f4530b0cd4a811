// printf-style formatting into a std::string, for the system's fixed log formats
// ("%s: error=%d msg=%s", "%2X", "(unknown: %i)").
#pragma once

#include <string>

namespace pyx {

[[nodiscard]] std::string format(const char* fmt, ...) __attribute__((format(printf, 1, 2)));

}  // namespace pyx
