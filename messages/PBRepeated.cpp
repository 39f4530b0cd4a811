#include "messages/PBRepeated.h"

#include "core/Format.h"

namespace pyx {

namespace {

template <class List>
std::uint64_t hashValues(const List& list) {
    if (list.empty()) return 0;
    std::uint64_t h = 0xcbf29ce484222325ULL;
    for (const auto value : list) {
        auto bits = static_cast<std::uint32_t>(value);
        for (int i = 0; i < 4; ++i) {
            h ^= bits & 0xFF;
            h *= 0x100000001b3ULL;
            bits >>= 8;
        }
    }
    return h;
}

template <class List>
Array toArray(const List& list) {
    Array out;
    out.reserve(list.size());
    for (const auto value : list) out.emplace_back(value);
    return out;
}

}  // namespace

std::uint64_t PBRepeatedUInt32Hash(const PBRepeatedUInt32& list) {
    return hashValues(list);
}
std::uint64_t PBRepeatedInt32Hash(const PBRepeatedInt32& list) {
    return hashValues(list);
}
Array PBRepeatedUInt32NSArray(const PBRepeatedUInt32& list) {
    return toArray(list);
}
Array PBRepeatedInt32NSArray(const PBRepeatedInt32& list) {
    return toArray(list);
}

IndexOutOfRange::IndexOutOfRange(std::size_t index, std::size_t count)
    : std::out_of_range(format("idx (%zu) is out of range (%zu)", index, count)),
      index_(index),
      count_(count) {}

}  // namespace pyx
