// UMTS (WCDMA) message specifics.
#include <gtest/gtest.h>

#include "TestBytes.h"
#include "messages/Messages.h"

namespace pyx {
namespace {

using test::bytes;
using test::key;
using test::operator+;

TEST(WcdmaRrcConnectionState, EstablishmentCause23ShowsUnknown) {
    KCellularWcdmaRrcConnectionState m;
    m.setEstablishmentCause(23);
    EXPECT_EQ(test::valueAt(m.dictionaryRepresentation(), "establishment_cause"),
              Value("(unknown: 23)"));
}

TEST(WcdmaRrcConnectionState, EstablishmentCause0ShowsOrigConvCall) {
    const auto m = KCellularWcdmaRrcConnectionState::initWithData(bytes({0x18, 0x00}));
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->dictionaryRepresentation(),
              (Dict{{"establishment_cause", "KRRC_EST_ORIG_CONV_CALL"}}));
}

TEST(WcdmaSelReselCellInfo, Fields14To20AreUnknownAndSkipped) {
    Bytes in;
    for (int tag = 14; tag <= 20; ++tag)
        in = in + key(static_cast<std::uint64_t>(tag), 0) + bytes({1});
    in = in + key(13, 0) + bytes({0x03}) + key(21, 0) + bytes({0x06});
    const auto m = KCellularWcdmaSelReselCellInfo::initWithData(in);
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->dictionaryRepresentation(),
              (Dict{{"multi_band_info", Array{}}, {"s_search_rat", -2}, {"s_cell_prio", 6U}}));
    for (int tag = 14; tag <= 20; ++tag) {
        EXPECT_EQ(KCellularWcdmaSelReselCellInfo::descriptor().fieldForTag(
                      static_cast<std::uint32_t>(tag)),
                  nullptr);
    }
}

TEST(WcdmaSelReselCellInfo, MultiBandInfoIsPackedUnderTag5) {
    KCellularWcdmaSelReselCellInfo m;
    m.addMultiBandInfo(1);
    m.addMultiBandInfo(200);
    m.setSCellPrio(2);
    EXPECT_EQ(m.data(), bytes({0x2A, 0x03, 0x01, 0xC8, 0x01, 0xA8, 0x01, 0x02}));
    const auto one = KCellularWcdmaSelReselCellInfo::initWithData(key(5, 0) + bytes({0x09}));
    ASSERT_TRUE(one.has_value());
    EXPECT_EQ(one->multiBandInfos(), (std::vector<std::uint32_t>{9}));
}

TEST(WcdmaCellInfo, HasNoFields2And3And11And12) {
    const Bytes in = key(2, 0) + bytes({1}) + key(3, 0) + bytes({1}) + key(11, 0) + bytes({1}) +
                     key(12, 0) + bytes({1}) + key(10, 0) + bytes({0x40});
    const auto m = KCellularWcdmaCellInfo::initWithData(in);
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->dictionaryRepresentation(), (Dict{{"psc", 64U}}));
}

TEST(WcdmaCellInfo, HspaAndBandShowByName) {
    KCellularWcdmaCellInfo m;
    m.setWcdmaBand(SYS_BAND_WCDMA_I_IMT_2000);
    m.setHspa(SYS_HS_IND_HSDPA_HSUPA_SUPP_CELL);
    EXPECT_EQ(m.dictionaryRepresentation(), (Dict{{"wcdma_band", "SYS_BAND_WCDMA_I_IMT_2000"},
                                                  {"hspa", "SYS_HS_IND_HSDPA_HSUPA_SUPP_CELL"}}));
}

TEST(WcdmaSelReselCellInfo, DuplexModeShowsFddOrTdd) {
    KCellularWcdmaSelReselCellInfo m;
    m.setDuplexMode(TDD);
    EXPECT_EQ(test::valueAt(m.dictionaryRepresentation(), "duplex_mode"), Value("TDD"));
    m.setDuplexMode(2);
    EXPECT_EQ(test::valueAt(m.dictionaryRepresentation(), "duplex_mode"), Value("(unknown: 2)"));
}

}  // namespace
}  // namespace pyx
