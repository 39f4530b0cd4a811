#include "sources/sim/Random.h"

#include <algorithm>

namespace pyx::sim {

namespace {

std::uint64_t splitmix64(std::uint64_t& x) {
    std::uint64_t z = (x += 0x9E3779B97F4A7C15ULL);
    z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9ULL;
    z = (z ^ (z >> 27)) * 0x94D049BB133111EBULL;
    return z ^ (z >> 31);
}

constexpr std::uint64_t rotl(std::uint64_t x, int k) {
    return (x << k) | (x >> (64 - k));
}

}  // namespace

Random::Random(std::uint64_t seed) {
    std::uint64_t x = seed;
    for (auto& word : state_) word = splitmix64(x);
}

std::uint64_t Random::next() {
    const std::uint64_t result = rotl(state_[1] * 5, 7) * 9;
    const std::uint64_t t = state_[1] << 17;
    state_[2] ^= state_[0];
    state_[3] ^= state_[1];
    state_[1] ^= state_[2];
    state_[0] ^= state_[3];
    state_[2] ^= t;
    state_[3] = rotl(state_[3], 45);
    return result;
}

std::int64_t Random::between(std::int64_t low, std::int64_t high) {
    if (high <= low) return low;
    const auto span = static_cast<std::uint64_t>(high - low) + 1;
    // The small bias of the modulo does not matter for a simulated drive.
    return low + static_cast<std::int64_t>(span == 0 ? next() : next() % span);
}

double Random::unit() {
    return static_cast<double>(next() >> 11) * 0x1.0p-53;
}

bool Random::chance(double probability) {
    return unit() < probability;
}

std::int64_t Random::walk(std::int64_t value, std::int64_t step, std::int64_t low,
                          std::int64_t high) {
    return std::clamp<std::int64_t>(value + between(-step, step), low, high);
}

}  // namespace pyx::sim
