#include "messages/KBBMetricUtility.h"

#include <gtest/gtest.h>

#include "core/Log.h"
#include "messages/lte/KCellularLteTxPower.h"

namespace pyx {
namespace {

const MessageDescriptor& anyClass() {
    return KCellularLteTxPower::descriptor();
}

TEST(KBBMetricUtility, TxPowerTagIsValidAndLogged) {
    CapturedLines log(systemLogSink());
    EXPECT_TRUE(KBBMetricUtility::isValidMetricIdTag(std::uint16_t{0xD302}, anyClass()));
    EXPECT_EQ(log.lines(), std::vector<std::string>{"valid metricId tag"});
}

TEST(KBBMetricUtility, SecondaryCellMeasurementTagIsNotValid) {
    CapturedLines log(systemLogSink());
    EXPECT_FALSE(KBBMetricUtility::isValidMetricIdTag(std::uint16_t{0xD317}, anyClass()));
    EXPECT_TRUE(log.lines().empty());
}

TEST(KBBMetricUtility, WholeMetricIdIsNotATag) {
    EXPECT_FALSE(KBBMetricUtility::isValidMetricIdTag(0x3CD302, anyClass()));
    EXPECT_FALSE(KBBMetricUtility::isValidMetricIdTag(std::int64_t{-1}, anyClass()));
    EXPECT_TRUE(KBBMetricUtility::isValidMetricIdTag(0xD302, anyClass()));
}

TEST(KBBMetricUtility, TableHoldsThe31TagsWithTheirTexts) {
    int valid = 0;
    for (std::uint32_t tag = 0; tag <= 0xFFFF; ++tag) {
        if (KBBMetricUtility::isValidMetricIdTag(static_cast<std::uint16_t>(tag), anyClass()))
            ++valid;
    }
    EXPECT_EQ(valid, 31);
    EXPECT_EQ(KBBMetricUtility::classNameForTag(0x4F6A), "KCellularRsrpRsrqSinr");
    EXPECT_EQ(KBBMetricUtility::classNameForTag(0x0013), "kCellularSimCardFiles");
    EXPECT_EQ(KBBMetricUtility::classNameForTag(0x2E0C), "kCellularGsmScellInfo");
    EXPECT_TRUE(KBBMetricUtility::classNameForTag(0xD317).empty());
}

}  // namespace
}  // namespace pyx
