#include "tools/DecodeCommand.h"

#include <gtest/gtest.h>

#include <nlohmann/json.hpp>
#include <sstream>

#include "core/Log.h"

namespace pyx {
namespace {

using Json = nlohmann::ordered_json;

// KCellularLteTxPower: timestamp 1500000000123, one tx_power_info {pucch 10, pusch 15}.
constexpr const char* kTxPowerPayload = "08fbb0def7d32b12040814101e";

class Decode : public ::testing::Test {
  protected:
    std::shared_ptr<MetricValidator> validator = MetricValidator::create(nullptr);
    CapturedLines storeLines{standardOutputSink()};

    Json decoded(const std::string& line) { return Json::parse(decodeLine(*validator, line)); }
};

TEST_F(Decode, StoredRecordNamesItsPropertyAndDictionaryInKeyOrder) {
    const Json out = decoded(std::string(R"({"kKeyMetricID": 3986178, "kKeyPayload": ")") +
                             kTxPowerPayload + R"("})");
    const Json expected = Json::parse(
        R"({"metric":"0x3CD302","property":"myLTETxPowerDict","dict":{"timestamp":"2017-07-14 02:40:00 GMT","tx_power_info":[{"pucch_tx_power":10,"pusch_tx_power":15}]}})");
    EXPECT_EQ(out, expected);
    EXPECT_EQ(out.dump(), expected.dump());
    EXPECT_TRUE(storeLines.contains("Metric ID in Hex = 3CD302"));
}

TEST_F(Decode, PayloadInUpperCaseHexIsTheSame) {
    std::string upper = kTxPowerPayload;
    for (char& c : upper) c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    const Json out = decoded(R"({"kKeyMetricID": 3986178, "kKeyPayload": ")" + upper + R"("})");
    EXPECT_EQ(out["property"], "myLTETxPowerDict");
}

TEST_F(Decode, NotCaredForMetricIsIgnored) {
    EXPECT_EQ(decoded(R"({"kKeyMetricID": 3986177, "kKeyPayload": "0800"})"),
              Json::parse(R"({"metric":"0x3CD301","ignored":true})"));
}

TEST_F(Decode, RejectedRecordGivesTheMetricAndTheReason) {
    EXPECT_EQ(decoded(R"({"kKeyMetricID": 3986178, "kKeyPayload": "08ff"})"),
              Json::parse(R"({"metric":"0x3CD302",
                              "error":"does not decode as KCellularLteTxPower: truncated varint at byte 1"})"));
}

// The "error" of a payload that does not decode: the class, the reason and the byte.
class DecodeRefusal : public Decode {
  protected:
    std::string errorOf(std::int64_t metricID, const std::string& hexPayload) {
        const Json out = decoded(R"({"kKeyMetricID": )" + std::to_string(metricID) +
                                 R"(, "kKeyPayload": ")" + hexPayload + R"("})");
        EXPECT_FALSE(out.contains("dict")) << out.dump();
        return out.value("error", "");
    }
};

TEST_F(DecodeRefusal, TruncatedVarint) {
    EXPECT_EQ(errorOf(3952132, "08fbb0def7d32b100318012085"),
              "does not decode as KCellularLteRrcState: truncated varint at byte 12");
}

TEST_F(DecodeRefusal, LengthPastTheEnd) {
    EXPECT_EQ(errorOf(3986178, "08011205080a"),
              "does not decode as KCellularLteTxPower: length past the end at byte 3");
}

TEST_F(DecodeRefusal, TruncatedFixedWidthValue) {
    EXPECT_EQ(errorOf(3986178, "0801a101010203"),
              "does not decode as KCellularLteTxPower: truncated fixed-width value at "
              "byte 4");
}

TEST_F(DecodeRefusal, UnknownWireType) {
    EXPECT_EQ(errorOf(3986178, "08014f"),
              "does not decode as KCellularLteTxPower: unknown wire type at byte 2");
}

TEST_F(DecodeRefusal, MismatchedEndOfGroup) {
    EXPECT_EQ(errorOf(3986178, "0801bb01c401"),
              "does not decode as KCellularLteTxPower: end of group does not match "
              "its start at byte 4");
}

TEST_F(DecodeRefusal, GroupWithoutItsEnd) {
    EXPECT_EQ(errorOf(3986178, "0801bb010802"),
              "does not decode as KCellularLteTxPower: group without its end at byte 2");
}

TEST_F(Decode, LineThatIsNotARecordGivesNullMetric) {
    const Json out = decoded("not json");
    EXPECT_TRUE(out["metric"].is_null());
    EXPECT_EQ(out["error"], "the line is not JSON");
}

TEST_F(Decode, BadHexNamesTheMetricItBelongedTo) {
    const Json out = decoded(R"({"kKeyMetricID": 3986178, "kKeyPayload": "xyz"})");
    EXPECT_EQ(out["metric"], "0x3CD302");
    EXPECT_TRUE(out.contains("error"));
}

TEST_F(Decode, RecordWithoutMetricIDIsRejectedWithNullMetric) {
    const Json out = decoded(R"({"kKeyPayload": "0800"})");
    EXPECT_TRUE(out["metric"].is_null());
    EXPECT_EQ(out["error"], "no metric ID");
}

TEST_F(Decode, BytesInTheDictionaryBecomeHexDigits) {
    // KCellularSimCardFiles: timestamp 1, one file {ef_id 0x6F07, content 08 29}.
    const Json out =
        decoded(R"({"kKeyMetricID": 3932179, "kKeyPayload": "080112080887de0112020829"})");
    ASSERT_TRUE(out.contains("dict")) << out.dump();
    EXPECT_EQ(out["dict"]["ef_list"][0]["content"], "0829");
}

TEST(DecodeRun, OneOutputLinePerInputLineInOrder) {
    CapturedLines storeLines(standardOutputSink());
    std::istringstream in(std::string(R"({"kKeyMetricID": 3986178, "kKeyPayload": ")") +
                          kTxPowerPayload + "\"}\n" + "\n" + R"({"kKeyMetricID": 0})" + "\r\n" +
                          R"({"kKeyMetricID": 3986178, "kKeyPayload": ""})" + "\n");
    std::ostringstream out;
    EXPECT_EQ(runDecode(in, out), 0);
    std::istringstream lines(out.str());
    std::vector<Json> results;
    for (std::string line; std::getline(lines, line);) results.push_back(Json::parse(line));
    ASSERT_EQ(results.size(), 4U);
    EXPECT_EQ(results[0]["property"], "myLTETxPowerDict");
    EXPECT_TRUE(results[1].contains("error"));
    EXPECT_EQ(results[2], Json::parse(R"({"metric":"0x0","ignored":true})"));
    EXPECT_EQ(results[3]["error"], "the decoded KCellularLteTxPower has no numeric timestamp");
}

}  // namespace
}  // namespace pyx
