// The history behind the charts: its window, its bounds, merged slots, the series it keys,
// the neighbour ranking and replays whose times go backwards.
#include <gtest/gtest.h>

#include <cstdint>
#include <limits>
#include <string>
#include <tuple>
#include <vector>

#include "metrics/history/History.h"

namespace pyx {
namespace {

using P = MetricValidator::DictionaryProperty;

constexpr double kStart = 1'717'200'000'000.0;  // 2024-06-01 00:00:00 UTC, in ms

Dict gsmIdle(int rxlev) {
    return Dict{{"idle_rxlev_dBm", Value(std::int64_t{rxlev})}};
}

Dict entry(std::initializer_list<std::pair<std::string, Value>> fields) {
    Dict out;
    for (const auto& [key, value] : fields) out.append(key, value);
    return out;
}

Dict lteNeighbours(const std::vector<std::pair<int, int>>& pciAndRsrp) {
    Array list;
    for (const auto& [pci, rsrp] : pciAndRsrp)
        list.emplace_back(entry({{"nbr_earfcn", Value(std::int64_t{6300})},
                                 {"nbr_phys_cell_id", Value(std::int64_t{pci})},
                                 {"nbr_rsrp", Value(std::int64_t{rsrp})},
                                 {"nbr_rsrq", Value(-10.5F)}}));
    return Dict{{"meas_nbr_eutra", Value(std::move(list))}};
}

Dict lteNeighboursWithRsrq(const std::vector<std::tuple<int, int, float>>& pciRsrpAndRsrq) {
    Array list;
    for (const auto& [pci, rsrp, rsrq] : pciRsrpAndRsrq)
        list.emplace_back(entry({{"nbr_earfcn", Value(std::int64_t{6300})},
                                 {"nbr_phys_cell_id", Value(std::int64_t{pci})},
                                 {"nbr_rsrp", Value(std::int64_t{rsrp})},
                                 {"nbr_rsrq", Value(rsrq)}}));
    return Dict{{"meas_nbr_eutra", Value(std::move(list))}};
}

std::vector<std::string> labels(const std::vector<const Series*>& series) {
    std::vector<std::string> out;
    for (const Series* s : series) out.push_back(s->label());
    return out;
}

History small(std::size_t points, double windowMs) {
    History::Limits limits;
    limits.pointsPerSeries = points;
    limits.windowMs = windowMs;
    return History(limits);
}

TEST(History, OneArrivalIsOnePointAtTheEventsOwnTime) {
    History history;
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-82), kStart);
    const auto series = history.seriesOf(Chart::GsmServing, 0);
    ASSERT_EQ(series.size(), 1U);
    EXPECT_EQ(series[0]->label(), "RxLev idle");
    EXPECT_EQ(unitText(series[0]->quantity().unit), "dBm");
    ASSERT_EQ(series[0]->points().size(), 1U);
    EXPECT_EQ(series[0]->points().at(0).timeMs, kStart);
    EXPECT_EQ(series[0]->points().at(0).last, -82.0F);
    EXPECT_EQ(history.newestMs(), kStart);
}

TEST(History, WithoutATimestampTheArrivalTimeIsUsed) {
    History history(History::Limits{}, [] { return kStart + 42; });
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-80), std::nullopt);
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-81), 0.0);
    const auto series = history.seriesOf(Chart::GsmServing, 0);
    ASSERT_EQ(series.size(), 1U);
    EXPECT_EQ(series[0]->points().at(0).timeMs, kStart + 42);
    EXPECT_EQ(series[0]->points().at(0).count, 2U);
}

TEST(History, KeepsOnlyTheWindowInAFixedNumberOfPoints) {
    // 10 slots of one second: a ten-second window.
    History history = small(10, 10'000);
    for (int second = 0; second < 25; ++second)
        history.record(P::myGSMIdleScellMeasDict, gsmIdle(-60 - second), kStart + second * 1000.0);
    const auto& points = history.seriesOf(Chart::GsmServing, 0)[0]->points();
    EXPECT_EQ(points.size(), 10U);
    EXPECT_EQ(points.capacity(), 10U);
    EXPECT_EQ(points.at(0).timeMs, kStart + 15'000);
    EXPECT_EQ(points.newest().timeMs, kStart + 24'000);
    EXPECT_EQ(points.newest().last, -84.0F);
}

TEST(History, ValuesWithinOneSlotMergeKeepingTheirMinimumAndMaximum) {
    History history = small(10, 10'000);
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-90), kStart);
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-110), kStart + 300);
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-95), kStart + 600);
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-70), kStart + 1200);
    const auto& points = history.seriesOf(Chart::GsmServing, 0)[0]->points();
    ASSERT_EQ(points.size(), 2U);
    EXPECT_EQ(points.at(0).min, -110.0F);
    EXPECT_EQ(points.at(0).max, -90.0F);
    EXPECT_EQ(points.at(0).last, -95.0F);
    EXPECT_EQ(points.at(0).count, 3U);
    EXPECT_EQ(points.at(0).timeMs, kStart);
    EXPECT_EQ(points.at(1).min, -70.0F);
}

TEST(History, ServingQuantitiesComeFromTheStoredDictionary) {
    History history;
    Array inst;
    inst.emplace_back(entry({{"rsrp0", Value(std::int64_t{-96})},
                             {"rsrq0", Value(std::int64_t{-13})},
                             {"sinr0", Value(15.0F)}}));
    const Dict stored{{"avg_values", Value(entry({{"rsrp0", Value(std::int64_t{-97})},
                                                  {"rsrq0", Value(std::int64_t{-14})},
                                                  {"sinr0", Value(std::int64_t{27})}}))},
                      {"inst_values", Value(std::move(inst))}};
    history.record(P::myLTERsrpRsrqSinrDict, stored, kStart);
    const auto series = history.seriesOf(Chart::LteServing, 0);
    EXPECT_EQ(labels(series), (std::vector<std::string>{"RSRP avg", "RSRP", "RSRQ avg", "RSRQ",
                                                        "SINR avg", "SINR"}));
    EXPECT_EQ(series[1]->points().newest().last, -96.0F);
    EXPECT_EQ(series[5]->points().newest().last, 15.0F);
    EXPECT_TRUE(history.seriesOf(Chart::LteCarriers, 0).empty());
}

TEST(History, AveragesAreChartedInTheUnitTheScreenShowsTheirInstantaneousTwinsIn) {
    History history;
    const Dict stored{{"avg_values", Value(entry({{"rsrp0", Value(std::int64_t{-97})},
                                                  {"rsrq0", Value(std::int64_t{-14})},
                                                  {"sinr0", Value(std::int64_t{27})}}))}};
    history.record(P::myLTERsrpRsrqSinrDict, stored, kStart);
    const auto series = history.seriesOf(Chart::LteServing, 0);
    ASSERT_EQ(labels(series), (std::vector<std::string>{"RSRP avg", "RSRQ avg", "SINR avg"}));
    EXPECT_EQ(series[0]->points().newest().last, -97.0F);  // kept raw on screen too
    EXPECT_EQ(series[1]->points().newest().last, -14.0F);
    EXPECT_EQ(series[2]->points().newest().last, 13.5F);  // half-dB steps, as sinr0 is shown
}

TEST(History, CarriersAreKeyedByTheirIndex) {
    History history;
    Array carriers;
    for (int index : {2, 1})
        carriers.emplace_back(entry({{"index", Value(std::int64_t{index})},
                                     {"rsrp", Value(std::int64_t{-100 - index})},
                                     {"rsrq", Value(-9.5F)},
                                     {"snr", Value(std::int64_t{12})}}));
    history.record(P::myLTECAStatusDict, Dict{{"scc_list", Value(std::move(carriers))}}, kStart);
    const auto series = history.seriesOf(Chart::LteCarriers, 0);
    EXPECT_EQ(labels(series), (std::vector<std::string>{"CC 1 RSRP", "CC 2 RSRP", "CC 1 RSRQ",
                                                        "CC 2 RSRQ", "CC 1 SNR", "CC 2 SNR"}));
    EXPECT_EQ(series[0]->key(), (SeriesKey{series[0]->key().quantity, 1, -1}));
    EXPECT_EQ(series[1]->points().newest().last, -102.0F);
}

TEST(History, OnlyTheStrongestEightNeighboursAreKeptAndShownStrongestFirst) {
    History history;
    std::vector<std::pair<int, int>> neighbours;
    for (int pci = 0; pci < 12; ++pci) neighbours.emplace_back(pci, -120 + 3 * pci);
    history.record(P::myLTEIntraRatMeasDict, lteNeighbours(neighbours), kStart);
    const auto series = history.seriesOf(Chart::LteNeighbours, 0);
    ASSERT_EQ(series.size(), 16U);  // RSRP and RSRQ of eight neighbours
    EXPECT_EQ(series[0]->label(), "6300/11");
    EXPECT_EQ(series[0]->points().newest().last, -87.0F);
    EXPECT_EQ(series[7]->label(), "6300/4");
    EXPECT_EQ(unitText(series[8]->quantity().unit), "dB");
    EXPECT_EQ(history.seriesCount(), 16U);

    // Later the weak ones rise and are heard alone: they come first, then the strongest of
    // those heard before.
    std::vector<std::pair<int, int>> risen;
    for (int pci = 0; pci < 4; ++pci) risen.emplace_back(pci, -60 - pci);
    history.record(P::myLTEIntraRatMeasDict, lteNeighbours(risen), kStart + 10'000);
    const auto now = history.seriesOf(Chart::LteNeighbours, 0);
    EXPECT_EQ(now[0]->label(), "6300/0");
    EXPECT_EQ(now[3]->label(), "6300/3");
    EXPECT_EQ(now[4]->label(), "6300/11");
    EXPECT_EQ(now.size(), 16U);
}

TEST(History, EveryPanelOfNeighboursListsTheSameCellsInTheOrderOfTheirRanking) {
    History history;
    // The stronger the RSRP, the weaker the RSRQ.
    std::vector<std::tuple<int, int, float>> neighbours;
    for (int pci = 0; pci < 10; ++pci)
        neighbours.emplace_back(pci, -120 + 3 * pci, -3.0F - static_cast<float>(pci));
    history.record(P::myLTEIntraRatMeasDict, lteNeighboursWithRsrq(neighbours), kStart);
    const auto series = history.seriesOf(Chart::LteNeighbours, 0);
    ASSERT_EQ(series.size(), 16U);
    const std::vector<std::string> order{"6300/9", "6300/8", "6300/7", "6300/6",
                                         "6300/5", "6300/4", "6300/3", "6300/2"};
    const std::vector<const Series*> rsrp(series.begin(), series.begin() + 8);
    const std::vector<const Series*> rsrq(series.begin() + 8, series.end());
    EXPECT_EQ(labels(rsrp), order);
    EXPECT_EQ(labels(rsrq), order);
    EXPECT_EQ(rsrq[0]->quantity().name, "RSRQ");
    EXPECT_EQ(rsrq[0]->points().newest().last, -12.0F);
    EXPECT_EQ(rsrq[0]->rank(), -93.0F);
}

TEST(History, ANeighbourHeardNowComesBeforeAStrongerOneHeardLongAgo) {
    History history;
    history.record(P::myLTEIntraRatMeasDict, lteNeighboursWithRsrq({{7, -60, -5.0F}}), kStart);
    for (int second = 1; second <= 120; ++second)
        history.record(P::myLTEIntraRatMeasDict, lteNeighboursWithRsrq({{1, -110, -18.0F}}),
                       kStart + second * 1000.0);
    const auto series = history.seriesOf(Chart::LteNeighbours, 0);
    EXPECT_EQ(labels(series), (std::vector<std::string>{"6300/1", "6300/7", "6300/1", "6300/7"}));

    // Heard again: the stronger one leads.
    history.record(P::myLTEIntraRatMeasDict, lteNeighboursWithRsrq({{7, -61, -5.0F}}),
                   kStart + 121'000);
    EXPECT_EQ(labels(history.seriesOf(Chart::LteNeighbours, 0)),
              (std::vector<std::string>{"6300/7", "6300/1", "6300/7", "6300/1"}));
}

TEST(History, OnlyEightNeighboursAreShownThoseHeardNowFirst) {
    History history;
    std::vector<std::tuple<int, int, float>> strong;
    for (int pci = 0; pci < 8; ++pci) strong.emplace_back(pci, -60 - pci, -5.0F);
    history.record(P::myLTEIntraRatMeasDict, lteNeighboursWithRsrq(strong), kStart);
    history.record(P::myLTEIntraRatMeasDict, lteNeighboursWithRsrq({{20, -115, -19.0F}}),
                   kStart + 60'000);
    const auto series = history.seriesOf(Chart::LteNeighbours, 0);
    ASSERT_EQ(series.size(), 16U);
    EXPECT_EQ(series[0]->label(), "6300/20");
    EXPECT_EQ(series[1]->label(), "6300/0");
    EXPECT_EQ(series[7]->label(), "6300/6");  // the weakest of the earlier ones is left out
    EXPECT_EQ(series[8]->label(), "6300/20");
}

TEST(History, NeighboursThatComeAndGoUseABoundedNumberOfSeries) {
    History::Limits limits;
    limits.seriesPerQuantity = 16;
    History history(limits);
    for (int step = 0; step < 200; ++step) {
        std::vector<std::pair<int, int>> neighbours;
        for (int i = 0; i < 8; ++i) neighbours.emplace_back(step * 8 + i, -90);
        history.record(P::myLTEIntraRatMeasDict, lteNeighbours(neighbours), kStart + step * 1000.0);
    }
    EXPECT_EQ(history.seriesCount(), 32U);  // 16 for RSRP, 16 for RSRQ
    // The latest neighbours are there; the stalest gave way.
    const auto series = history.seriesOf(Chart::LteNeighbours, kStart + 199'000);
    ASSERT_EQ(series.size(), 16U);
    EXPECT_EQ(series[0]->label(), "6300/1592");
}

TEST(History, TimeGoingBackwardsStartsANewSession) {
    History history;
    for (int second = 0; second < 5; ++second)
        history.record(P::myGSMIdleScellMeasDict, gsmIdle(-80), kStart + second * 2000.0);
    EXPECT_EQ(history.session(), 0U);

    // A little behind (another kind's clock): merged, same session.
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-99), kStart + 7000);
    EXPECT_EQ(history.session(), 0U);
    EXPECT_EQ(history.seriesOf(Chart::GsmServing, 0)[0]->points().newest().min, -99.0F);

    // The replay starts over: only the new session's points remain.
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-70), kStart - 60'000);
    EXPECT_EQ(history.session(), 1U);
    EXPECT_EQ(history.newestMs(), kStart - 60'000);
    const auto& points = history.seriesOf(Chart::GsmServing, 0)[0]->points();
    ASSERT_EQ(points.size(), 1U);
    EXPECT_EQ(points.at(0).last, -70.0F);
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-71), kStart - 58'000);
    EXPECT_EQ(history.seriesOf(Chart::GsmServing, 0)[0]->points().size(), 2U);
}

Dict txPower(int pusch) {
    Array info;
    info.emplace_back(entry({{"pusch_tx_power", Value(std::int64_t{pusch})}}));
    return Dict{{"tx_power_info", Value(std::move(info))}};
}

TEST(History, AChartsRevisionMovesOnlyWhenAPointOfThatChartIsAdded) {
    History history;
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-80), kStart);
    const auto gsm = history.revision(Chart::GsmServing);
    const auto lte = history.revision(Chart::LteServing);
    for (int second = 1; second <= 5; ++second)
        history.record(P::myLTETxPowerDict, txPower(10 + second), kStart + second * 1000.0);
    EXPECT_EQ(history.revision(Chart::GsmServing), gsm);
    EXPECT_NE(history.revision(Chart::LteServing), lte);

    // A GSM arrival without a charted value adds no point either.
    history.record(P::myGSMIdleScellMeasDict, Dict{{"scell_arfcn", Value(std::int64_t{62})}},
                   kStart + 6000);
    EXPECT_EQ(history.revision(Chart::GsmServing), gsm);
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-81), kStart + 7000);
    EXPECT_NE(history.revision(Chart::GsmServing), gsm);
}

TEST(History, EveryChartsRevisionMovesWhenTheHistoryStartsOrStartsOver) {
    History history;
    const auto umts = history.revision(Chart::UmtsNeighbours);
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-80), kStart);
    const auto started = history.revision(Chart::UmtsNeighbours);
    EXPECT_NE(started, umts);  // the charts' window now ends at a time
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-80), kStart + 2000);
    EXPECT_EQ(history.revision(Chart::UmtsNeighbours), started);
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-70), kStart - 60'000);
    EXPECT_NE(history.revision(Chart::UmtsNeighbours), started);
}

TEST(History, KindsWithoutQuantitiesAndMissingFieldsAddNothing) {
    History history;
    history.record(P::myLTERRCStateDict, Dict{{"rrc_state", Value(std::int64_t{1})}}, kStart);
    history.record(P::myGSMIdleScellMeasDict, Dict{{"scell_arfcn", Value(std::int64_t{62})}},
                   kStart);
    history.record(P::myLTETxPowerDict, Dict{{"tx_power_info", Value(Array{})}}, kStart);
    EXPECT_EQ(history.seriesCount(), 0U);
    EXPECT_TRUE(history.seriesOf(Chart::GsmServing, 0).empty());
}

TEST(History, OlderSeriesDropOutOfTheRequestedWindow) {
    History history;
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-80), kStart);
    EXPECT_EQ(history.seriesOf(Chart::GsmServing, kStart).size(), 1U);
    EXPECT_TRUE(history.seriesOf(Chart::GsmServing, kStart + 1).empty());
}

TEST(History, AKindAddsPointsOnlyToTheChartsThatReadIt) {
    History history;
    history.record(P::myGSMIdleScellMeasDict, gsmIdle(-80), kStart);
    const auto lte = history.revision(Chart::LteServing);
    history.record(P::myUMTSTxPowerDict, txPower(12), kStart + 1000);
    EXPECT_EQ(history.revision(Chart::LteServing), lte);
    history.record(P::myLTETxPowerDict, txPower(12), kStart + 2000);
    EXPECT_NE(history.revision(Chart::LteServing), lte);

    const auto gsm = history.revision(Chart::GsmNeighbours);
    Array list;
    list.emplace_back(
        entry({{"arfcn", Value(std::int64_t{58})}, {"rxlev", Value(std::int64_t{-82})}}));
    history.record(P::myGSMNbrMeasDict, Dict{{"gsm_ncell_meas", Value(std::move(list))}},
                   kStart + 3000);
    EXPECT_NE(history.revision(Chart::GsmNeighbours), gsm);
}

TEST(History, GsmNeighboursAreKeyedByTheirArfcn) {
    History history;
    Array list;
    list.emplace_back(
        entry({{"arfcn", Value(std::int64_t{58})}, {"rxlev", Value(std::int64_t{-82})}}));
    history.record(P::myGSMNbrMeasDict, Dict{{"gsm_ncell_meas", Value(std::move(list))}}, kStart);
    const auto series = history.seriesOf(Chart::GsmNeighbours, 0);
    ASSERT_EQ(series.size(), 1U);
    EXPECT_EQ(series[0]->label(), "ARFCN 58");
}

TEST(History, EntriesWithTheLargestNumbersAreKeyedLikeAnyOther) {
    History history;
    Array list;
    for (const std::int64_t earfcn :
         {std::numeric_limits<std::int64_t>::max(), std::numeric_limits<std::int64_t>::max() - 1})
        list.emplace_back(
            entry({{"nbr_earfcn", Value(earfcn)},
                   {"nbr_phys_cell_id", Value(std::numeric_limits<std::int64_t>::max())},
                   {"nbr_rsrp", Value(std::int64_t{-90})},
                   {"nbr_rsrq", Value(-10.5F)}}));
    history.record(P::myLTEIntraRatMeasDict, Dict{{"meas_nbr_eutra", Value(std::move(list))}},
                   kStart);
    EXPECT_EQ(history.seriesOf(Chart::LteNeighbours, 0).size(), 4U);  // RSRP and RSRQ of two
}

TEST(History, RefusesLimitsThatHoldNothing) {
    History::Limits limits;
    limits.pointsPerSeries = 0;
    EXPECT_THROW(History{limits}, std::invalid_argument);
}

}  // namespace
}  // namespace pyx
