#include "metrics/KindWork.h"

#include <gtest/gtest.h>

#include <limits>

namespace pyx {
namespace {

const BandwidthTable kDlbw{{0, 1.4F}, {1, 3.0F}, {2, 5.0F}, {3, 10.0F}, {4, 15.0F}, {5, 20.0F}};

struct Holders {
    LTEListHolder lte;
    UMTSListHolder umts;
    GSMListHolder gsm;
    CommonListHolder common;
    StoreUpdate update() { return StoreUpdate(lte, umts, gsm, common, kDlbw); }
};

Value list(std::initializer_list<Dict> entries) {
    Array out;
    for (const auto& e : entries) out.emplace_back(e);
    return Value(std::move(out));
}

TEST(KindWork, ScellInfoBandwidthsAreHalvedTowardZero) {
    Holders h;
    Dict stored{{"timestamp", Value("t")}, {"dl_bw", Value(100U)}, {"ul_bw", Value(15U)}};
    auto update = h.update();
    kindwork::lteScellInfo(stored, update);
    EXPECT_EQ(*stored.find("dl_bw"), Value(std::int64_t{50}));
    EXPECT_EQ(*stored.find("ul_bw"), Value(std::int64_t{7}));
    // No list is staged: committing leaves every holder empty.
    update.commit();
    EXPECT_EQ(h.lte, LTEListHolder{});
    EXPECT_EQ(h.umts, UMTSListHolder{});
    EXPECT_EQ(h.gsm, GSMListHolder{});
    EXPECT_EQ(h.common, CommonListHolder{});
}

TEST(KindWork, ScellInfoBandwidthThatIsNotAnIntegerIsLeft) {
    Holders h;
    Dict stored{{"dl_bw", Value("wide")}, {"ul_bw", Value(1.5F)}};
    const Dict before = stored;
    auto update = h.update();
    kindwork::lteScellInfo(stored, update);
    EXPECT_EQ(stored, before);
}

TEST(KindWork, NothingReachesTheHoldersBeforeCommit) {
    Holders h;
    h.lte.TxPower = {Dict{{"old", Value(1)}}};
    Dict stored{{"tx_power_info", list({Dict{{"pucch_tx_power", Value(3)}}})}};
    auto update = h.update();
    kindwork::lteTxPower(stored, update);
    EXPECT_EQ(h.lte.TxPower, (EntryList{Dict{{"old", Value(1)}}}));
    update.commit();
    EXPECT_EQ(h.lte.TxPower, (EntryList{Dict{{"pucch_tx_power", Value(3)}}}));
}

TEST(KindWork, AListTheRecordLacksBecomesEmpty) {
    Holders h;
    h.lte.UtraNbrsMeas = {Dict{{"rscp", Value(-90)}}};
    h.lte.GeraNbrsMeas = {Dict{{"rxlev", Value(-60)}}};
    Dict stored{{"meas_nbr_geran", list({Dict{{"rxlev", Value(63U)}}})}};
    auto update = h.update();
    kindwork::lteNbrInterRatCellMeas(stored, update);
    update.commit();
    EXPECT_TRUE(h.lte.UtraNbrsMeas.empty());
    EXPECT_EQ(h.lte.GeraNbrsMeas, (EntryList{Dict{{"rxlev", Value(std::int64_t{-47})}}}));
}

TEST(KindWork, ConvertedEntriesAreWrittenBackIntoTheStoredDictionary) {
    Holders h;
    Dict stored{{"meas_nbr_eutra", list({Dict{{"nbr_rsrp", Value(97)}, {"nbr_rsrq", Value(34)}}})}};
    auto update = h.update();
    kindwork::lteNbrEutraCellMeas(stored, update);
    update.commit();
    const Dict expected{{"nbr_rsrp", Value(std::int64_t{-43})}, {"nbr_rsrq", Value(-2.5F)}};
    EXPECT_EQ(stored.find("meas_nbr_eutra")->asArray().at(0).asDict(), expected);
    EXPECT_EQ(h.lte.EutraNbrsMeas, EntryList{expected});
}

TEST(KindWork, LteSelReselSplitsCellInfoFromNeighboursAndLooksUpBandwidth) {
    Holders h;
    Dict stored{{"timestamp", Value("t")},
                {"multi_band_info", Value(Array{Value(3U)})},
                {"nbr_eutra", list({Dict{{"earfcn", Value(100U)}, {"dl_bw", Value(0U)}},
                                    Dict{{"earfcn", Value(200U)}, {"dl_bw", Value(6U)}}})},
                {"priority_operating_freq", Value(1U)}};
    auto update = h.update();
    kindwork::lteSelReselCellInfo(stored, update);
    update.commit();
    const Dict cellInfo{{"timestamp", Value("t")},
                        {"multi_band_info", Value(Array{Value(3U)})},
                        {"priority_operating_freq", Value(1U)}};
    EXPECT_EQ(h.lte.SelReselCellInfo, EntryList{cellInfo});
    ASSERT_EQ(h.lte.EutraNbrs.size(), 2U);
    EXPECT_EQ(*h.lte.EutraNbrs[0].find("dl_bw"), Value(1.4F));
    EXPECT_EQ(*h.lte.EutraNbrs[1].find("dl_bw"), Value(6U));
    EXPECT_EQ(*stored.find("nbr_eutra")->asArray()[0].asDict().find("dl_bw"), Value(1.4F));
}

TEST(KindWork, CaStatusConvertsCarriersAndLooksUpDlBandwidth) {
    Holders h;
    Dict stored{{"scc_list", list({Dict{{"dl_bandwidth", Value(5U)},
                                        {"rsrp", Value(-10050)},
                                        {"rsrq", Value(-1050)},
                                        {"rssi", Value(-6099)}}})}};
    auto update = h.update();
    kindwork::lteCarrierAggregationStatus(stored, update);
    update.commit();
    const Dict expected{{"dl_bandwidth", Value(20.0F)},
                        {"rsrp", Value(std::int64_t{-100})},
                        {"rsrq", Value(-10.5F)},
                        {"rssi", Value(std::int64_t{-60})}};
    EXPECT_EQ(h.lte.CAStatusList, EntryList{expected});
}

TEST(KindWork, UmtsRxInfoEntriesCarryTheConnectedModeAfterTheirOwnKeys) {
    Holders h;
    Dict stored{{"timestamp", Value("t")},
                {"connected_mode", Value(true)},
                {"rx_info", list({Dict{{"rssi", Value(-70)}}, Dict{{"snr", Value(5)}}})}};
    const Dict before = stored;
    auto update = h.update();
    kindwork::wcdmaScellMeasurement(stored, update);
    update.commit();
    ASSERT_EQ(h.umts.rXInfo.size(), 2U);
    EXPECT_EQ(h.umts.rXInfo[0], (Dict{{"rssi", Value(-70)}, {"connected_mode", Value(true)}}));
    EXPECT_EQ(h.umts.rXInfo[1], (Dict{{"snr", Value(5)}, {"connected_mode", Value(true)}}));
    EXPECT_EQ(stored, before);
}

TEST(KindWork, UmtsRxInfoWithoutConnectedModeKeepsItsOwnKeys) {
    Holders h;
    Dict stored{{"rx_info", list({Dict{{"rssi", Value(-70)}}})}};
    auto update = h.update();
    kindwork::wcdmaScellMeasurement(stored, update);
    update.commit();
    EXPECT_EQ(h.umts.rXInfo, EntryList{(Dict{{"rssi", Value(-70)}})});
}

TEST(KindWork, UmtsSelReselFeedsCellInfoAndThreePriorityLists) {
    Holders h;
    Dict stored{{"timestamp", Value("t")},
                {"s_rxlev", Value(-3)},
                {"eutra_prio_info", list({Dict{{"earfcn", Value(1U)}}})},
                {"utra_prio_info", list({Dict{{"uarfcn", Value(2U)}}})},
                {"gsm_prio_info", list({Dict{{"arfcn", Value(3U)}}})}};
    auto update = h.update();
    kindwork::wcdmaSelReselCellInfo(stored, update);
    update.commit();
    EXPECT_EQ(h.umts.SelReselCellInfo,
              EntryList{(Dict{{"timestamp", Value("t")}, {"s_rxlev", Value(-3)}})});
    EXPECT_EQ(h.umts.eUtraNbrs, EntryList{(Dict{{"earfcn", Value(1U)}})});
    EXPECT_EQ(h.umts.utraNbrs, EntryList{(Dict{{"uarfcn", Value(2U)}})});
    EXPECT_EQ(h.umts.geraNbrs, EntryList{(Dict{{"arfcn", Value(3U)}})});
}

TEST(KindWork, UmtsNeighbourResultsGoToTheirMeasLists) {
    Holders h;
    Dict stored{{"meas_utra_result", list({Dict{{"rscp", Value(0)}, {"ecno", Value(49U)}}})},
                {"meas_gsm_result", list({Dict{{"rxlev", Value(63U)}}})},
                {"meas_lte_result", list({Dict{{"rsrp", Value(97)}, {"rsrq", Value(34)}}})}};
    auto update = h.update();
    kindwork::wcdmaNbrCellMeas(stored, update);
    update.commit();
    EXPECT_EQ(h.umts.utraNbrMeas,
              EntryList{(Dict{{"rscp", Value(std::int64_t{-116})}, {"ecno", Value(0.0F)}})});
    EXPECT_EQ(h.umts.geraNbrMeas, EntryList{(Dict{{"rxlev", Value(std::int64_t{-47})}})});
    EXPECT_EQ(h.umts.eUtraNbrMeas,
              EntryList{(Dict{{"rsrp", Value(std::int64_t{-43})}, {"rsrq", Value(-2.5F)}})});
}

TEST(KindWork, GsmNeighbourReportFeedsThreeLists) {
    Holders h;
    Dict stored{{"gsm_ncell_meas", list({Dict{{"rxlev", Value(63U)}}})},
                {"umts_ncell_meas", list({Dict{{"cpich_rscp", Value(16U)}}})},
                {"lte_ncell_meas", list({Dict{{"rsrp", Value(40U)}, {"rsrq", Value(9U)}}})}};
    auto update = h.update();
    kindwork::gsmGrrEventMeasCr(stored, update);
    update.commit();
    EXPECT_EQ(h.gsm.geraNbrMeas, EntryList{(Dict{{"rxlev", Value(std::int64_t{-47})}})});
    EXPECT_EQ(h.gsm.utraNbrMeas, EntryList{(Dict{{"cpich_rscp", Value(std::int64_t{-100})}})});
    EXPECT_EQ(h.gsm.eUtraNbrMeas,
              EntryList{(Dict{{"rsrp", Value(std::int64_t{-100})}, {"rsrq", Value(-15.0F)}})});
}

TEST(KindWork, BearersAndSimFilesFeedTheCommonHolder) {
    Holders h;
    Dict bearers{{"bearer_contexts", list({Dict{{"cid", Value(1U)}}, Dict{{"cid", Value(2U)}}})}};
    Dict sim{{"ef_list", list({Dict{{"ef_id", Value(0x6F07U)}}})}};
    auto update = h.update();
    kindwork::activatedBearerContexts(bearers, update);
    kindwork::simCardFiles(sim, update);
    update.commit();
    EXPECT_EQ(h.common.activeBearer.size(), 2U);
    EXPECT_EQ(h.common.simContents, EntryList{(Dict{{"ef_id", Value(0x6F07U)}})});
    EXPECT_TRUE(h.common.MMCommonInfo.empty());
    EXPECT_TRUE(h.common.IMSI.empty());
}

TEST(KindWork, OverflowStopsTheWorkBeforeAnyListIsStaged) {
    Holders h;
    h.lte.UtraNbrsMeas = {Dict{{"rscp", Value(-90)}}};
    const LTEListHolder before = h.lte;
    Dict stored{
        {"meas_nbr_utra", list({Dict{{"rscp", Value(std::numeric_limits<std::int64_t>::min())}}})}};
    auto update = h.update();
    EXPECT_THROW(kindwork::lteNbrInterRatCellMeas(stored, update), ConversionOverflow);
    // Nothing was staged either: committing what there is changes nothing.
    update.commit();
    EXPECT_EQ(h.lte, before);
}

}  // namespace
}  // namespace pyx
