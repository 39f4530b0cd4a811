// GSM message specifics.
#include <gtest/gtest.h>

#include "TestBytes.h"
#include "core/Log.h"
#include "messages/Messages.h"

namespace pyx {
namespace {

using test::bytes;
using test::key;
using test::operator+;

TEST(GsmScellInfo, State0ShowsUnknown) {
    const auto m = KCellularGsmScellInfo::initWithData(key(11, 0) + bytes({0}));
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->dictionaryRepresentation(), (Dict{{"state", "(unknown: 0)"}}));
    KCellularGsmScellInfo named;
    named.setState(NON_DEDICATED_STATE);
    EXPECT_EQ(named.dictionaryRepresentation(), (Dict{{"state", "NON_DEDICATED_STATE"}}));
}

TEST(GsmCsRfMeasurement, CsTxPwrIsWrittenPackedUnderTag5AsZigzag) {
    KCellularGsmCsRfMeasurement m;
    m.addCsTxPwr(-5);
    m.addCsTxPwr(30);
    m.setCsRxlevSub(40);
    EXPECT_EQ(m.data(), bytes({0x2A, 0x02, 0x09, 0x3C, 0x30, 0x28}));
}

TEST(GsmCsRfMeasurement, CsTxPwrIsReadPackedOrOneByOne) {
    const auto packed =
        KCellularGsmCsRfMeasurement::initWithData(key(5, 2) + bytes({2, 0x09, 0x3C}));
    const auto single = KCellularGsmCsRfMeasurement::initWithData(key(5, 0) + bytes({0x09}) +
                                                                  key(5, 0) + bytes({0x3C}));
    ASSERT_TRUE(packed.has_value());
    ASSERT_TRUE(single.has_value());
    EXPECT_EQ(packed->csTxPwrs(), (std::vector<std::int32_t>{-5, 30}));
    EXPECT_TRUE(packed.value() == single.value());
}

TEST(GsmCsRfMeasurement, DictionaryAlwaysHoldsCsTxPwr) {
    KCellularGsmCsRfMeasurement m;
    m.setScellArfcn(10);
    EXPECT_EQ(m.dictionaryRepresentation(), (Dict{{"scell_arfcn", 10U}, {"cs_tx_pwr", Array{}}}));
    m.addCsTxPwr(-1);
    EXPECT_EQ(test::valueAt(m.dictionaryRepresentation(), "cs_tx_pwr"), Value(Array{-1}));
}

TEST(GsmScellInfo, HasNoFields2And3And12) {
    const Bytes in = key(2, 0) + bytes({1}) + key(3, 2) + bytes({1, 1}) + key(12, 0) + bytes({1}) +
                     key(13, 0) + bytes({2});
    const auto m = KCellularGsmScellInfo::initWithData(in);
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->dictionaryRepresentation(), (Dict{{"num_mnc_digits", 2U}}));
}

TEST(GsmIdleConfig, KeepsAccKeyForField23BetweenT3212AndBsPaMfrms) {
    KCellularGsmIdleConfig m;
    m.setBsPaMfrms(3);
    m.setAcc(0x3FF);
    m.setT3212(10);
    const Dict d = m.dictionaryRepresentation();
    ASSERT_EQ(d.size(), 3U);
    EXPECT_EQ(d.at(0).key, "t3212");
    EXPECT_EQ(d.at(1).key, "acc");
    EXPECT_EQ(d.at(2).key, "bs_pa_mfrms");
    EXPECT_EQ(KCellularGsmIdleConfig::descriptor().fieldForTag(23)->key, "acc");
}

TEST(GsmIdleConfig, CrOffsetUnderMetricTag19IsDroppedAndLogged) {
    CapturedLines log(systemLogSink());
    const auto m = KCellularGsmIdleConfig::initWithData(key(19, 0) + bytes({0x07}) + key(20, 0) +
                                                        bytes({0x01}));
    ASSERT_TRUE(m.has_value());
    EXPECT_FALSE(m->hasCrOffset());
    EXPECT_EQ(m->dictionaryRepresentation(), (Dict{{"tmp_offset", 1U}}));
    EXPECT_TRUE(log.contains("valid metricId tag"));
    EXPECT_TRUE(log.contains("Unknown tag: 13:7"));
}

TEST(GsmIdleConfig, GsmBandIsAPlainNumber) {
    KCellularGsmIdleConfig m;
    m.setGsmBand(47);
    EXPECT_EQ(m.dictionaryRepresentation(), (Dict{{"gsm_band", 47U}}));
}

TEST(GsmGrrEventMeasCr, NeighbourListsKeepTheirNames) {
    KCellularGsmGrrEventMeasCr m;
    auto g = std::make_shared<GsmNcellMeas>();
    g->setArfcn(512);
    m.addGsmNcellMeas(g);
    m.addUmtsNcellMeas(std::make_shared<UmtsNcellMeas>());
    EXPECT_EQ(m.gsmNcellMeasCount(), 1U);
    EXPECT_EQ(m.gsmNcellMeasAtIndex(0)->arfcn(), 512U);
    EXPECT_EQ(m.umtsNcellMeasCount(), 1U);
    EXPECT_EQ(m.lteNcellMeasCount(), 0U);
    m.clearGsmNcellMeas();
    EXPECT_EQ(m.gsmNcellMeasCount(), 0U);
}

}  // namespace
}  // namespace pyx
