// The message classes as the message reader target sees them: the input's first byte picks
// one (modulo the count), the rest is its payload.
#pragma once

#include <cstdint>
#include <span>
#include <string_view>

namespace pyx::fuzz {

struct FuzzClass {
    std::string_view name;
    // Reads payload as this class and checks what a successful read promises; aborts with a
    // line on stderr when a promise is broken.
    void (*check)(std::span<const std::uint8_t> payload);
};

[[nodiscard]] std::span<const FuzzClass> fuzzClasses();

// The index of the class named name, or -1.
[[nodiscard]] int fuzzClassIndex(std::string_view name);

}  // namespace pyx::fuzz
