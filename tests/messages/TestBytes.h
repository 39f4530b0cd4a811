// Small helpers for writing wire bytes by hand in tests.
#pragma once

#include <cstdint>
#include <initializer_list>
#include <string_view>

#include "core/Value.h"

namespace pyx::test {

inline Bytes bytes(std::initializer_list<int> values) {
    Bytes out;
    for (const int v : values) out.push_back(static_cast<std::uint8_t>(v));
    return out;
}

// A varint key for field number tag and wire type.
inline Bytes key(std::uint64_t tag, int wireType) {
    std::uint64_t v = (tag << 3) | static_cast<std::uint64_t>(wireType);
    Bytes out;
    while (v >= 0x80) {
        out.push_back(static_cast<std::uint8_t>(v | 0x80));
        v >>= 7;
    }
    out.push_back(static_cast<std::uint8_t>(v));
    return out;
}

// The value under key, or null when the dictionary has no such key.
inline Value valueAt(const Dict& dict, std::string_view key) {
    const Value* v = dict.find(key);
    return v != nullptr ? *v : Value();
}

inline Bytes operator+(Bytes a, const Bytes& b) {
    a.insert(a.end(), b.begin(), b.end());
    return a;
}

}  // namespace pyx::test
