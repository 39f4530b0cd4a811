#include "sources/sim/Random.h"

#include <gtest/gtest.h>

#include <set>

namespace {

using pyx::sim::Random;

TEST(SimRandom, TheSameSeedGivesTheSameSequence) {
    Random a(42);
    Random b(42);
    for (int i = 0; i < 1000; ++i) ASSERT_EQ(a.next(), b.next());
}

TEST(SimRandom, DifferentSeedsGiveDifferentSequences) {
    Random a(1);
    Random b(2);
    int same = 0;
    for (int i = 0; i < 100; ++i) same += a.next() == b.next() ? 1 : 0;
    EXPECT_LT(same, 2);
}

TEST(SimRandom, TheFirstValuesOfSeedOneAreFixed) {
    // A change of generator would change every simulated drive: keep it deliberate.
    Random r(1);
    const std::uint64_t first = r.next();
    Random again(1);
    EXPECT_EQ(again.next(), first);
    EXPECT_NE(first, 0U);
}

TEST(SimRandom, BetweenStaysWithinItsBoundsAndReachesBoth) {
    Random r(7);
    std::set<std::int64_t> seen;
    for (int i = 0; i < 2000; ++i) {
        const std::int64_t v = r.between(-3, 3);
        ASSERT_GE(v, -3);
        ASSERT_LE(v, 3);
        seen.insert(v);
    }
    EXPECT_EQ(seen.size(), 7U);
    EXPECT_EQ(r.between(5, 5), 5);
    EXPECT_EQ(r.between(5, 1), 5);
}

TEST(SimRandom, UnitIsInTheHalfOpenInterval) {
    Random r(9);
    for (int i = 0; i < 2000; ++i) {
        const double u = r.unit();
        ASSERT_GE(u, 0.0);
        ASSERT_LT(u, 1.0);
    }
}

TEST(SimRandom, AWalkStaysWithinItsBounds) {
    Random r(11);
    std::int64_t v = 0;
    for (int i = 0; i < 5000; ++i) {
        const std::int64_t next = r.walk(v, 2, -10, 10);
        ASSERT_LE(std::abs(next - v), 2);
        ASSERT_GE(next, -10);
        ASSERT_LE(next, 10);
        v = next;
    }
}

}  // namespace
