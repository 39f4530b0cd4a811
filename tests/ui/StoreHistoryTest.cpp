// The store feeds its history on every stored arrival, with the values it stores and the
// event's own time; a refused record adds nothing.
#include <gtest/gtest.h>

#include "StoreFeed.h"
#include "metrics/history/History.h"

namespace pyx {
namespace {

TEST(StoreHistory, EveryStoredArrivalAddsItsQuantitiesAtTheEventsTime) {
    const auto store = test::emptyStore();
    const auto history = std::make_shared<History>();
    store->setHistory(history);
    test::feedUmtsScellMeas(*store, 2);
    const auto series = history->seriesOf(Chart::UmtsServing, 0);
    ASSERT_EQ(series.size(), 1U);
    EXPECT_EQ(series[0]->label(), "RSSI");
    EXPECT_EQ(series[0]->points().newest().timeMs, static_cast<double>(test::kTimestamp));
    EXPECT_EQ(series[0]->points().newest().last, -70.0F);
}

TEST(StoreHistory, ARefusedRecordAddsNothing) {
    const auto store = test::emptyStore();
    const auto history = std::make_shared<History>();
    store->setHistory(history);
    EXPECT_THROW(store->metricsDidUpdate(test::record(store->K_UMTS_SCELL_MEAS, Bytes{0x08})),
                 MetricRejected);
    EXPECT_EQ(history->seriesCount(), 0U);
}

TEST(StoreHistory, WithoutAHistoryTheStoreKeepsNone) {
    const auto store = test::emptyStore();
    test::feedUmtsScellMeas(*store, 1);
    EXPECT_EQ(store->history(), nullptr);
}

}  // namespace
}  // namespace pyx
