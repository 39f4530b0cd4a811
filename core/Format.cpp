#include "core/Format.h"

#include <cstdarg>
#include <cstdio>

namespace pyx {

std::string format(const char* fmt, ...) {
    char stack[256];
    va_list args;
    va_start(args, fmt);
    va_list copy;
    va_copy(copy, args);
    const int n = std::vsnprintf(stack, sizeof stack, fmt, args);
    va_end(args);
    std::string out;
    if (n < 0) {
        va_end(copy);
        return out;
    }
    if (static_cast<std::size_t>(n) < sizeof stack) {
        out.assign(stack, static_cast<std::size_t>(n));
    } else {
        out.resize(static_cast<std::size_t>(n));
        std::vsnprintf(out.data(), out.size() + 1, fmt, copy);
    }
    va_end(copy);
    return out;
}

}  // namespace pyx
