#include "baseband/EventRecord.h"

#include <gtest/gtest.h>

namespace {

using pyx::Bytes;
using pyx::Dict;
using pyx::Value;

TEST(EventRecord, ADictionaryEventKeepsItsKeysValuesAndOrder) {
    const Value event(Dict{{"kKeyMetricID", Value(std::int64_t{3932179})},
                           {"kKeyPayload", Value(Bytes{1, 2, 3})},
                           {"kKeyPayloadType", Value(std::int64_t{0})}});
    const pyx::MetricRecord record = pyx::metricRecordFromEvent(event);
    EXPECT_EQ(record, event.asDict());
    ASSERT_EQ(record.size(), 3U);
    EXPECT_EQ(record.at(0).key, "kKeyMetricID");
    EXPECT_EQ(record.at(2).key, "kKeyPayloadType");
}

TEST(EventRecord, AnEventThatIsNotADictionaryBecomesAnEmptyRecord) {
    EXPECT_TRUE(pyx::metricRecordFromEvent(Value()).empty());
    EXPECT_TRUE(pyx::metricRecordFromEvent(Value(std::int64_t{5})).empty());
    EXPECT_TRUE(pyx::metricRecordFromEvent(Value(Bytes{1})).empty());
}

TEST(EventRecord, AMovedEventGivesTheSameRecord) {
    Value event(Dict{{"kKeyMetricID", Value(std::int64_t{1})}});
    const Value copy = event;
    EXPECT_EQ(pyx::metricRecordFromEvent(std::move(event)), copy.asDict());
}

}  // namespace
