// LTE message specifics.
#include <gtest/gtest.h>

#include "TestBytes.h"
#include "core/Log.h"
#include "messages/Messages.h"

namespace pyx {
namespace {

using test::bytes;
using test::key;
using test::operator+;

std::string textOf(const Dict& dict, std::string_view k) {
    const Value* v = dict.find(k);
    return v != nullptr && v->isString() ? v->asString() : std::string("<missing>");
}

TEST(LteRrcState, Cause254ShowsNoService) {
    KCellularLteRrcState m;
    m.setCause(254);
    EXPECT_EQ(textOf(m.dictionaryRepresentation(), "cause"), "KLTE_RRC_CAUSE_NO_SERVICE");
}

TEST(LteRrcState, Cause31ShowsUnknown) {
    const auto m = KCellularLteRrcState::initWithData(bytes({0x28, 31}));
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(textOf(m->dictionaryRepresentation(), "cause"), "(unknown: 31)");
}

TEST(LteSelReselCellInfo, MultiBandInfoIsReadPackedOrOneByOneAndWrittenPackedUnderTag2) {
    const auto packed = KCellularLteSelReselCellInfo::initWithData(key(2, 2) + bytes({2, 3, 7}));
    const auto single =
        KCellularLteSelReselCellInfo::initWithData(key(2, 0) + bytes({3}) + key(2, 0) + bytes({7}));
    ASSERT_TRUE(packed.has_value());
    ASSERT_TRUE(single.has_value());
    EXPECT_TRUE(packed.value() == single.value());
    EXPECT_EQ(single->data(), bytes({0x12, 0x02, 0x03, 0x07}));
    EXPECT_EQ(test::valueAt(single->dictionaryRepresentation(), "multi_band_info"),
              Value(Array{3U, 7U}));
}

TEST(LteSelReselCellInfo, DictionaryAlwaysHoldsMultiBandInfo) {
    EXPECT_EQ(KCellularLteSelReselCellInfo().dictionaryRepresentation(),
              (Dict{{"multi_band_info", Array{}}}));
}

TEST(LteSelReselCellInfo, ThreshServingLowQUnderMetricTag19IsDroppedAndLogged) {
    CapturedLines log(systemLogSink());
    const auto m = KCellularLteSelReselCellInfo::initWithData(key(19, 0) + bytes({0x04}) +
                                                              key(18, 0) + bytes({0x05}));
    ASSERT_TRUE(m.has_value());
    EXPECT_FALSE(m->hasThreshServingLowQ());
    EXPECT_EQ(m->threshServingLowP(), 5U);
    EXPECT_FALSE(m->dictionaryRepresentation().contains("Thresh_serving_lowQ"));
    EXPECT_TRUE(log.contains("Unknown tag: 13:4"));
    // Set in code, it is still written under 19 (and so never read back).
    KCellularLteSelReselCellInfo set;
    set.setThreshServingLowQ(4);
    EXPECT_EQ(set.data(), key(19, 0) + bytes({0x04}));
}

TEST(LteScellInfo, Field13IsSkippedAsUnknown) {
    const auto m = KCellularLteScellInfo::initWithData(key(13, 0) + bytes({0x09}) + key(14, 0) +
                                                       bytes({0x02}));
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->dictionaryRepresentation(), (Dict{{"tdd_sf_assignment", 2U}}));
    EXPECT_EQ(KCellularLteScellInfo::descriptor().fieldForTag(13), nullptr);
}

TEST(LteCdrxConfig, Fields6And8And9AreSkippedAsUnknown) {
    const Bytes in = key(6, 0) + bytes({1}) + key(8, 0) + bytes({1}) + key(9, 2) +
                     bytes({1, 0xFF}) + key(7, 0) + bytes({40}) + key(12, 0) + bytes({3});
    const auto m = KCellularLteCdrxConfig::initWithData(in);
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->dictionaryRepresentation(),
              (Dict{{"long_drx_cycle_ms", 40U}, {"rrc_state", "KLTE_RRC_STATE_CONNECTED"}}));
}

TEST(LteRsrpRsrqSinr, HoldsOneAveragedRecordAndAListOfInstantaneousOnes) {
    KCellularLteRsrpRsrqSinr m;
    auto avg = std::make_shared<RsrpRsrqSinr>();
    avg->setRsrp0(-95);
    m.setAvgValues(avg);
    for (const int pci : {11, 12}) {
        auto inst = std::make_shared<RsrpRsrqSinr>();
        inst->setPhyCellId(static_cast<std::uint32_t>(pci));
        m.addInstValue(inst);
    }
    m.setCallId(std::string("c1"));
    // call_id (3), avg_values (14), then each inst_values (15).
    EXPECT_EQ(m.data(), bytes({0x1A, 0x02, 'c', '1', 0x72, 0x03, 0x20, 0xBD, 0x01, 0x7A, 0x02, 0x08,
                               11, 0x7A, 0x02, 0x08, 12}));
    const auto back = KCellularLteRsrpRsrqSinr::initWithData(m.data());
    ASSERT_TRUE(back.has_value());
    EXPECT_EQ(back->instValuesCount(), 2U);
    EXPECT_EQ(back->avgValues()->rsrp0(), -95);
    EXPECT_EQ(
        back->dictionaryRepresentation(),
        (Dict{{"call_id", "c1"},
              {"avg_values", Dict{{"rsrp0", -95}}},
              {"inst_values", Array{Dict{{"phy_cell_id", 11U}}, Dict{{"phy_cell_id", 12U}}}}}));
}

TEST(LteNbrEutra, FrameTypeShowsByName) {
    NbrEutra m;
    m.setFrameType(TDD);
    EXPECT_EQ(textOf(m.dictionaryRepresentation(), "frame_type"), "TDD");
}

TEST(LteSecondaryComponentCarrier, StateAndHasUplinkAreDistinctFields) {
    SecondaryComponentCarrier m;
    m.setHasUplink(false);
    EXPECT_TRUE(m.hasHasUplink());
    m.setState(SCC_STATE_ACTIVATED);
    EXPECT_EQ(m.dictionaryRepresentation(),
              (Dict{{"state", "SCC_STATE_ACTIVATED"}, {"has_uplink", false}}));
}

}  // namespace
}  // namespace pyx
