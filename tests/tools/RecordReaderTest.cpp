#include "tools/RecordReader.h"

#include <gtest/gtest.h>

namespace pyx {
namespace {

TEST(RecordReader, LineBecomesRecordWithIntegerIDAndPayloadBytes) {
    const MetricRecord record =
        readRecord(R"({"kKeyMetricID": 3986178, "kKeyPayload": "0a0B", "kKeyProfileID": 1})");
    ASSERT_EQ(record.size(), 2U);
    EXPECT_EQ(*record.find("kKeyMetricID"), Value(std::int64_t{3986178}));
    EXPECT_EQ(*record.find("kKeyPayload"), Value(Bytes{0x0a, 0x0b}));
}

TEST(RecordReader, EmptyPayloadIsEmptyBytes) {
    const MetricRecord record = readRecord(R"({"kKeyMetricID": 1, "kKeyPayload": ""})");
    EXPECT_EQ(*record.find("kKeyPayload"), Value(Bytes{}));
}

TEST(RecordReader, MissingPayloadStaysMissing) {
    const MetricRecord record = readRecord(R"({"kKeyMetricID": 3986177})");
    EXPECT_FALSE(record.contains("kKeyPayload"));
}

TEST(RecordReader, NonIntegerIDIsPassedOnForTheStoreToJudge) {
    EXPECT_EQ(*readRecord(R"({"kKeyMetricID": "3CD302"})").find("kKeyMetricID"), Value("3CD302"));
    EXPECT_EQ(*readRecord(R"({"kKeyMetricID": 1.5})").find("kKeyMetricID"), Value(1.5F));
    EXPECT_TRUE(readRecord(R"({"kKeyMetricID": null})").find("kKeyMetricID")->isNull());
    EXPECT_EQ(*readRecord(R"({"kKeyMetricID": -1})").find("kKeyMetricID"), Value(std::int64_t{-1}));
}

TEST(RecordReader, LineThatIsNotJsonIsATypedError) {
    try {
        (void)readRecord("{kKeyMetricID: 1");
        FAIL() << "no error";
    } catch (const RecordError& error) {
        EXPECT_FALSE(error.metricID());
        EXPECT_EQ(error.reason(), "the line is not JSON");
    }
}

TEST(RecordReader, JsonThatIsNotAnObjectIsATypedError) {
    EXPECT_THROW((void)readRecord("[1, 2]"), RecordError);
    EXPECT_THROW((void)readRecord("42"), RecordError);
    EXPECT_THROW((void)readRecord(""), RecordError);
}

TEST(RecordReader, PayloadThatIsNotHexNamesTheMetric) {
    try {
        (void)readRecord(R"({"kKeyMetricID": 3986178, "kKeyPayload": "0g"})");
        FAIL() << "no error";
    } catch (const RecordError& error) {
        EXPECT_EQ(error.metricID(), std::int64_t{3986178});
        EXPECT_NE(error.reason().find("hex"), std::string::npos);
    }
    EXPECT_THROW((void)readRecord(R"({"kKeyMetricID": 1, "kKeyPayload": "abc"})"), RecordError);
    EXPECT_THROW((void)readRecord(R"({"kKeyMetricID": 1, "kKeyPayload": 12})"), RecordError);
}

TEST(RecordReader, StructuredMetricIDIsATypedError) {
    EXPECT_THROW((void)readRecord(R"({"kKeyMetricID": [1]})"), RecordError);
}

TEST(RecordReader, HexDigitsInEitherCase) {
    EXPECT_EQ(bytesFromHex("DEADbeef"), (Bytes{0xde, 0xad, 0xbe, 0xef}));
    EXPECT_FALSE(bytesFromHex("0x"));
}

}  // namespace
}  // namespace pyx
