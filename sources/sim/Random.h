// The simulated baseband's own random numbers: xoshiro256** seeded through splitmix64, so a
// seed gives the same drive on every machine and every run.
#pragma once

#include <array>
#include <cstdint>

namespace pyx::sim {

class Random {
  public:
    explicit Random(std::uint64_t seed);

    std::uint64_t next();
    // Uniform in [low, high] (both included); low when high < low.
    std::int64_t between(std::int64_t low, std::int64_t high);
    // Uniform in [0, 1).
    double unit();
    // True with the given probability.
    bool chance(double probability);
    // One step of a bounded random walk: value moves by at most step, and stays in [low, high].
    std::int64_t walk(std::int64_t value, std::int64_t step, std::int64_t low, std::int64_t high);

  private:
    std::array<std::uint64_t, 4> state_{};
};

}  // namespace pyx::sim
