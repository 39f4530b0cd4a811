#include "metrics/ListConversions.h"

#include <gtest/gtest.h>

#include <limits>

namespace pyx {
namespace {

Dict messageWith(std::string_view list, Dict entry) {
    Dict message;
    message.append(std::string(list), Value(Array{Value(std::move(entry))}));
    return message;
}

const Dict& firstEntry(const Dict& message, std::string_view list) {
    return message.find(list)->asArray().at(0).asDict();
}

TEST(ListConversions, MeasNbrEutraEntryBecomesDbmAndHalfStepDb) {
    Dict message =
        messageWith("meas_nbr_eutra", Dict{{"nbr_rsrp", Value(97)}, {"nbr_rsrq", Value(34)}});
    convertList(message, listconversions::lteNbrEutraMeasNbrEutra);
    const Dict& entry = firstEntry(message, "meas_nbr_eutra");
    EXPECT_EQ(*entry.find("nbr_rsrp"), Value(std::int64_t{-43}));
    EXPECT_EQ(*entry.find("nbr_rsrq"), Value(-2.5F));
}

TEST(ListConversions, MeasNbrUtraEntryWithZeroRscpAndEcno49BecomesMinus116AndZero) {
    Dict message = messageWith("meas_nbr_utra", Dict{{"rscp", Value(0)}, {"ecno", Value(49U)}});
    convertList(message, listconversions::lteInterRatMeasNbrUtra);
    const Dict& entry = firstEntry(message, "meas_nbr_utra");
    EXPECT_EQ(*entry.find("rscp"), Value(std::int64_t{-116}));
    EXPECT_EQ(*entry.find("ecno"), Value(0.0F));
    EXPECT_EQ(entry.find("ecno")->description(), "0.0");
}

TEST(ListConversions, GsmNcellMeasRxlev63BecomesMinus47) {
    Dict message = messageWith("gsm_ncell_meas", Dict{{"rxlev", Value(63U)}});
    convertList(message, listconversions::gsmNbrMeasGsmNcell);
    EXPECT_EQ(*firstEntry(message, "gsm_ncell_meas").find("rxlev"), Value(std::int64_t{-47}));
}

TEST(ListConversions, SccListEntryHundredthsBecomeDbmAndDb) {
    Dict message = messageWith(
        "scc_list", Dict{{"rsrp", Value(-10050)}, {"rsrq", Value(-1050)}, {"rssi", Value(-6099)}});
    convertList(message, listconversions::lteCaStatusSccList);
    const Dict& entry = firstEntry(message, "scc_list");
    EXPECT_EQ(*entry.find("rsrp"), Value(std::int64_t{-100}));
    EXPECT_EQ(*entry.find("rsrq"), Value(-10.5F));
    EXPECT_EQ(*entry.find("rssi"), Value(std::int64_t{-60}));
}

TEST(ListConversions, InstValuesSinr0IsHalvedAndMissingSinr1StaysAbsent) {
    Dict message =
        messageWith("inst_values", Dict{{"phy_cell_id", Value(7U)}, {"sinr0", Value(31)}});
    convertList(message, listconversions::lteRsrpRsrqSinrInstValues);
    const Dict& entry = firstEntry(message, "inst_values");
    EXPECT_EQ(*entry.find("sinr0"), Value(15.5F));
    EXPECT_FALSE(entry.contains("sinr1"));
    EXPECT_EQ(entry.size(), 2U);
}

TEST(ListConversions, EntryWithStringRxlevIsLeftUnchanged) {
    const Dict entry{{"arfcn", Value(10U)}, {"rxlev", Value("strong")}};
    Dict message = messageWith("meas_nbr_geran", entry);
    convertList(message, listconversions::lteInterRatMeasNbrGeran);
    EXPECT_EQ(firstEntry(message, "meas_nbr_geran"), entry);
}

TEST(ListConversions, HundredthsToIntegerTruncatesTowardZero) {
    EXPECT_EQ(*convertValue(Conversion::HundredthsToInteger, Value(12345)),
              Value(std::int64_t{123}));
    EXPECT_EQ(*convertValue(Conversion::HundredthsToInteger, Value(-10050)),
              Value(std::int64_t{-100}));
}

TEST(ListConversions, EachFormulaGivesItsDisplayUnit) {
    EXPECT_EQ(*convertValue(Conversion::HundredthsToReal, Value(-1050)), Value(-10.5F));
    EXPECT_EQ(*convertValue(Conversion::LtePowerOffset, Value(97)), Value(std::int64_t{-43}));
    EXPECT_EQ(*convertValue(Conversion::LteQualityHalfSteps, Value(34)), Value(-2.5F));
    EXPECT_EQ(*convertValue(Conversion::UtraPowerOffset, Value(20)), Value(std::int64_t{-96}));
    EXPECT_EQ(*convertValue(Conversion::UtraQualityHalfSteps, Value(49)), Value(0.0F));
    EXPECT_EQ(*convertValue(Conversion::GeranLevelOffset, Value(63)), Value(std::int64_t{-47}));
    EXPECT_EQ(*convertValue(Conversion::Half, Value(31)), Value(15.5F));
}

TEST(ListConversions, ValueOfAnotherKindIsNotConverted) {
    EXPECT_FALSE(convertValue(Conversion::GeranLevelOffset, Value("63")));
    EXPECT_FALSE(convertValue(Conversion::Half, Value(Bytes{1, 2})));
    EXPECT_FALSE(convertValue(Conversion::LtePowerOffset, Value(Array{})));
}

TEST(ListConversions, OverflowingSubtractionIsATypedError) {
    const Value raw(std::numeric_limits<std::int64_t>::min());
    try {
        (void)convertValue(Conversion::UtraPowerOffset, raw, "rscp");
        FAIL() << "no overflow reported";
    } catch (const ConversionOverflow& overflow) {
        EXPECT_EQ(overflow.key(), "rscp");
        EXPECT_EQ(overflow.raw(), std::numeric_limits<std::int64_t>::min());
        EXPECT_NE(std::string(overflow.what()).find("rscp"), std::string::npos);
    }
}

TEST(ListConversions, AbsentOrEmptyListIsNoWork) {
    Dict message{{"timestamp", Value("t")}};
    const Dict before = message;
    convertList(message, listconversions::lteCaStatusSccList);
    EXPECT_EQ(message, before);
    Dict empty{{"scc_list", Value(Array{})}};
    convertList(empty, listconversions::lteCaStatusSccList);
    EXPECT_TRUE(empty.find("scc_list")->asArray().empty());
}

TEST(ListConversions, SameRawKeyIsConvertedByItsList) {
    // "rsrp" is hundredths in the carrier list but an offset index among UMTS's LTE neighbours.
    Dict carriers = messageWith("scc_list", Dict{{"rsrp", Value(-10050)}});
    convertList(carriers, listconversions::lteCaStatusSccList);
    EXPECT_EQ(*firstEntry(carriers, "scc_list").find("rsrp"), Value(std::int64_t{-100}));
    Dict neighbours = messageWith("meas_lte_result", Dict{{"rsrp", Value(50)}});
    convertList(neighbours, listconversions::wcdmaNbrMeasLteResult);
    EXPECT_EQ(*firstEntry(neighbours, "meas_lte_result").find("rsrp"), Value(std::int64_t{-90}));
}

TEST(ListConversions, UmtsNcellRuleNamesCpichEcnoSoTheEntrysCpichEcn0StaysRaw) {
    Dict message = messageWith("umts_ncell_meas",
                               Dict{{"cpich_rscp", Value(20U)}, {"cpich_ecn0", Value(30U)}});
    convertList(message, listconversions::gsmNbrMeasUmtsNcell);
    const Dict& entry = firstEntry(message, "umts_ncell_meas");
    EXPECT_EQ(*entry.find("cpich_rscp"), Value(std::int64_t{-96}));
    EXPECT_EQ(*entry.find("cpich_ecn0"), Value(30U));
}

TEST(ListConversions, BandwidthCodeBecomesMhzAndUnknownCodeStays) {
    const BandwidthTable table{{0, 1.4F}, {3, 10.0F}};
    Dict message{{"nbr_eutra",
                  Value(Array{Value(Dict{{"dl_bw", Value(3U)}}), Value(Dict{{"dl_bw", Value(9U)}}),
                              Value(Dict{{"dl_bw", Value("3")}})})}};
    replaceBandwidthCodes(message, "nbr_eutra", "dl_bw", table);
    const auto& entries = message.find("nbr_eutra")->asArray();
    EXPECT_EQ(*entries[0].asDict().find("dl_bw"), Value(10.0F));
    EXPECT_EQ(*entries[1].asDict().find("dl_bw"), Value(9U));
    EXPECT_EQ(*entries[2].asDict().find("dl_bw"), Value("3"));
}

}  // namespace
}  // namespace pyx
