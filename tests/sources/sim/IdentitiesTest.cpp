#include "sources/sim/Identities.h"

#include <gtest/gtest.h>

namespace {

using pyx::Bytes;

TEST(SimIdentities, APlmnWithATwoDigitMncHasAnFNibble) {
    EXPECT_EQ(pyx::sim::encodePlmn(1, 1, 2), (Bytes{0x00, 0xF1, 0x10}));
    EXPECT_EQ(pyx::sim::encodePlmn(262, 1, 2), (Bytes{0x62, 0xF2, 0x10}));
}

TEST(SimIdentities, APlmnWithAThreeDigitMncUsesAllNibbles) {
    EXPECT_EQ(pyx::sim::encodePlmn(310, 410, 3), (Bytes{0x13, 0x00, 0x14}));
}

TEST(SimIdentities, AnImsiIsBcdWithItsTypeNibbleAndOptionalLength) {
    EXPECT_EQ(pyx::sim::encodeImsi("001010123456789", false),
              (Bytes{0x09, 0x10, 0x10, 0x10, 0x32, 0x54, 0x76, 0x98}));
    EXPECT_EQ(pyx::sim::encodeImsi("001010123456789", true),
              (Bytes{0x08, 0x09, 0x10, 0x10, 0x10, 0x32, 0x54, 0x76, 0x98}));
}

TEST(SimIdentities, AnIccidIsSwappedBcd) {
    EXPECT_EQ(pyx::sim::encodeIccid("89001012345678901234"),
              (Bytes{0x98, 0x00, 0x01, 0x21, 0x43, 0x65, 0x87, 0x09, 0x21, 0x43}));
    EXPECT_EQ(pyx::sim::encodeIccid("123"), (Bytes{0x21, 0xF3}));
}

TEST(SimIdentities, TheLuhnCheckDigitIsTheStandardOne) {
    EXPECT_EQ(pyx::sim::luhnCheckDigit("7992739871"), '3');
    EXPECT_EQ(pyx::sim::luhnCheckDigit("8900101234567890123"), '9');
}

}  // namespace
