#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "Payloads.h"
#include "core/Log.h"
#include "metrics/MetricValidator.h"

namespace pyx {
namespace {

using testing::kTimestampText;
using testing::metricRecord;

// Every stored dictionary and list holder, for comparing the whole store.
struct StoreSnapshot {
    std::vector<std::optional<Dict>> dictionaries;
    LTEListHolder lte;
    UMTSListHolder umts;
    GSMListHolder gsm;
    CommonListHolder common;
    std::string text;  // the description of every dictionary, in property order

    explicit StoreSnapshot(const MetricValidator& v)
        : lte(v.myLTE()), umts(v.myUMTS()), gsm(v.myGSM()), common(v.myCommon()) {
        for (std::size_t i = 0; i < MetricValidator::kDictionaryPropertyCount; ++i) {
            const auto& d = v.dictionary(static_cast<MetricValidator::DictionaryProperty>(i));
            dictionaries.push_back(d);
            text += d ? Value(*d).description() : "(absent)";
            text += '\n';
        }
    }
    friend bool operator==(const StoreSnapshot&, const StoreSnapshot&) = default;
};

class Intake : public ::testing::Test {
  protected:
    std::shared_ptr<MetricValidator> validator = MetricValidator::create(nullptr);
    CapturedLines out{standardOutputSink()};

    // Fills every holder and a few dictionaries, so that a rejection has something to spoil.
    void fillStore() {
        using namespace testing;
        for (const auto& [id, payload] :
             std::vector<std::pair<std::int64_t, Bytes>>{{3986178, lteTxPower()},
                                                         {3986195, lteCaStatus()},
                                                         {3986199, lteSecondaryCellMeas()},
                                                         {3986192, lteInterRatMeas()},
                                                         {3986191, lteNbrEutraMeas(97, 34)},
                                                         {3986190, lteSelResel()},
                                                         {3952490, lteRsrpRsrqSinr()},
                                                         {3948738, lteScellInfo()},
                                                         {3985666, wcdmaScellMeas()},
                                                         {3985668, wcdmaSelResel()},
                                                         {3985669, wcdmaNbrMeas()},
                                                         {3985667, wcdmaTxPower()},
                                                         {3985417, gsmNbrMeas()},
                                                         {3986701, activeBearers()},
                                                         {3932179, simFiles()},
                                                         {3986700, emmContext()}}) {
            ASSERT_TRUE(validator->isMetricIDValidWithMetricdict(metricRecord(id, payload)));
        }
        out.clear();
    }

    void expectRejectedWithoutChange(const MetricRecord& record, const std::string& reasonPart) {
        fillStore();
        const StoreSnapshot before(*validator);
        try {
            validator->metricsDidUpdate(record);
            FAIL() << "the record was taken";
        } catch (const MetricRejected& rejection) {
            EXPECT_NE(rejection.reason().find(reasonPart), std::string::npos) << rejection.reason();
        }
        EXPECT_EQ(StoreSnapshot(*validator), before);
        EXPECT_FALSE(out.contains("Received Valid Metric"));
    }
};

TEST_F(Intake, TxPowerRecordIsStoredWithHexArrivalAndValidLines) {
    validator->metricsDidUpdate(metricRecord(3986178, testing::lteTxPower(10, 15)));
    ASSERT_TRUE(validator->myLTETxPowerDict());
    const std::string dict = std::string("{timestamp: ") + kTimestampText +
                             ", tx_power_info: [{pucch_tx_power: 10, pusch_tx_power: 15}]}";
    EXPECT_EQ(Value(*validator->myLTETxPowerDict()).description(), dict);
    EXPECT_EQ(out.lines(), (std::vector<std::string>{"Metric ID in Hex = 3CD302",
                                                     "Received LTE Tx Power is " + dict,
                                                     "Received Valid Metric"}));
}

TEST_F(Intake, LteScellMeasRecordIsNotCaredFor) {
    const StoreSnapshot before(*validator);
    validator->metricsDidUpdate(metricRecord(3986177, testing::lteTxPower()));
    EXPECT_EQ(out.lines(), (std::vector<std::string>{"Metric ID in Hex = 3CD301",
                                                     "I dont care for this Metric"}));
    EXPECT_EQ(StoreSnapshot(*validator), before);
}

TEST_F(Intake, LteRlfRecordIsNotCaredFor) {
    const StoreSnapshot before(*validator);
    validator->metricsDidUpdate(metricRecord(3952165, testing::lteTxPower()));
    EXPECT_EQ(out.lines(), (std::vector<std::string>{"Metric ID in Hex = 3C4E25",
                                                     "I dont care for this Metric"}));
    EXPECT_EQ(StoreSnapshot(*validator), before);
}

TEST_F(Intake, ZeroIDIsNotCaredForAndPrintsBlankPaddedHex) {
    const StoreSnapshot before(*validator);
    EXPECT_FALSE(validator->isMetricIDValidWithMetricdict(metricRecord(0, testing::lteTxPower())));
    EXPECT_EQ(out.lines(),
              (std::vector<std::string>{"Metric ID in Hex =  0", "I dont care for this Metric"}));
    EXPECT_EQ(StoreSnapshot(*validator), before);
}

TEST_F(Intake, UnknownIDIsNotCaredFor) {
    const StoreSnapshot before(*validator);
    validator->metricsDidUpdate(metricRecord(0x3CD399, Bytes{}));
    EXPECT_EQ(out.lines(), (std::vector<std::string>{"Metric ID in Hex = 3CD399",
                                                     "I dont care for this Metric"}));
    EXPECT_EQ(StoreSnapshot(*validator), before);
}

TEST_F(Intake, SecondRecordOfAKindReplacesTheFirstWhole) {
    validator->metricsDidUpdate(metricRecord(3948738, testing::lteScellInfo()));
    ASSERT_TRUE(validator->myLTESCellInfoDict()->contains("phy_cell_id"));
    validator->metricsDidUpdate(metricRecord(
        3948738, testing::payload<KCellularLteScellInfo>([](auto& m) { m.setCellId(77); })));
    const Dict expected{{"timestamp", Value(kTimestampText)}, {"cell_id", Value(77U)}};
    EXPECT_EQ(*validator->myLTESCellInfoDict(), expected);
}

TEST_F(Intake, TimestampBecomesDateTextInTheDevicesZone) {
    validator->metricsDidUpdate(
        metricRecord(3952132, testing::timestampOnly<KCellularLteRrcState>()));
    EXPECT_EQ(*validator->myLTERRCStateDict(),
              (Dict{{"timestamp", Value("2017-07-14 02:40:00 GMT")}}));
}

TEST_F(Intake, TriggerEventChangesNothingAndPrintsOnlyIDontCareForEvents) {
    fillStore();
    const StoreSnapshot before(*validator);
    const auto lastID = validator->metricID();
    MetricRecord trigger;
    trigger.append("kKeyTriggerID", Value(std::int64_t{0x7F0013}));
    trigger.append("kKeyMetricID", Value(std::int64_t{3986178}));
    trigger.append("kKeyPayload", Value(testing::lteTxPower()));
    validator->eventsDidUpdate(trigger);
    EXPECT_EQ(out.lines(), std::vector<std::string>{"I dont care for events"});
    EXPECT_EQ(StoreSnapshot(*validator), before);
    EXPECT_EQ(validator->metricID(), lastID);
}

TEST_F(Intake, RecordWithoutMetricIDIsRejectedAndChangesNothing) {
    MetricRecord record;
    record.append("kKeyPayload", Value(testing::lteTxPower()));
    expectRejectedWithoutChange(record, "no metric ID");
    EXPECT_FALSE(validator->metricID());
    EXPECT_TRUE(out.lines().empty());
}

TEST_F(Intake, MetricIDThatIsNotAnIntegerIsRejectedAndChangesNothing) {
    MetricRecord record;
    record.append("kKeyMetricID", Value("3CD302"));
    record.append("kKeyPayload", Value(testing::lteTxPower()));
    expectRejectedWithoutChange(record, "not an integer");
    EXPECT_FALSE(validator->metricID());
}

TEST_F(Intake, MissingPayloadIsRejectedAndChangesNothing) {
    MetricRecord record;
    record.append("kKeyMetricID", Value(std::int64_t{3986178}));
    expectRejectedWithoutChange(record, "no payload");
}

TEST_F(Intake, PayloadThatIsNotDataIsRejectedAndChangesNothing) {
    MetricRecord record;
    record.append("kKeyMetricID", Value(std::int64_t{3986178}));
    record.append("kKeyPayload", Value("0a0b"));
    expectRejectedWithoutChange(record, "not data");
}

TEST_F(Intake, UndecodablePayloadIsRejectedAndChangesNothing) {
    // A truncated varint: the reader runs past the end.
    expectRejectedWithoutChange(metricRecord(3986178, Bytes{0x08, 0xFF}),
                                "does not decode as KCellularLteTxPower");
}

TEST_F(Intake, UndecodableListRecordLeavesItsHolderAsItWas) {
    Bytes truncated = testing::lteNbrEutraMeas(10, 10);
    truncated.pop_back();
    expectRejectedWithoutChange(metricRecord(3986191, truncated), "does not decode");
}

TEST_F(Intake, DictionaryWithoutTimestampIsRejectedAndChangesNothing) {
    KCellularLteTxPower message;
    message.addTxPowerInfo(std::make_shared<TxPowerInfo>());
    expectRejectedWithoutChange(metricRecord(3986178, message.data()), "no numeric timestamp");
}

TEST_F(Intake, EmptyPayloadDecodesButHasNoTimestamp) {
    expectRejectedWithoutChange(metricRecord(3985669, Bytes{}), "no numeric timestamp");
}

TEST_F(Intake, RejectionNamesTheMetricIDAndReason) {
    try {
        validator->metricsDidUpdate(metricRecord(3986178, Bytes{0x08, 0xFF}));
        FAIL() << "the record was taken";
    } catch (const MetricRejected& rejection) {
        EXPECT_EQ(rejection.metricID(), std::int64_t{3986178});
        EXPECT_EQ(std::string(rejection.what()),
                  "metric 0x3CD302: does not decode as KCellularLteTxPower: "
                  "truncated varint at byte 1");
    }
}

// A payload that does not decode is refused with the reason and the byte where it stands.
// KCellularLteRrcState (0x3C4E04): timestamp (7 bytes), state, prev_state, then the key of
// prev_state_dur_ms at byte 11 and its value cut at byte 12.
const Bytes kRrcStateCutAtByte12 = {0x08, 0xFB, 0xB0, 0xDE, 0xF7, 0xD3, 0x2B,
                                    0x10, 0x03, 0x18, 0x01, 0x20, 0x85};

TEST_F(Intake, TruncatedVarintIsRejectedWithItsByte) {
    expectRejectedWithoutChange(
        metricRecord(3952132, kRrcStateCutAtByte12),
        "does not decode as KCellularLteRrcState: truncated varint at byte 12");
}

TEST_F(Intake, RejectionLineOfAnUndecodablePayloadSaysWhyAndWhere) {
    try {
        validator->metricsDidUpdate(metricRecord(3952132, kRrcStateCutAtByte12));
        FAIL() << "the record was taken";
    } catch (const MetricRejected& rejection) {
        EXPECT_EQ(std::string(rejection.what()),
                  "metric 0x3C4E04: does not decode as KCellularLteRrcState: "
                  "truncated varint at byte 12");
    }
}

TEST_F(Intake, NestedRecordPastTheEndIsRejectedWithItsByte) {
    // A list record: the last neighbour's length runs past the end of the payload.
    Bytes truncated = testing::lteNbrEutraMeas(10, 10);
    truncated.pop_back();
    expectRejectedWithoutChange(metricRecord(3986191, truncated), "length past the end at byte ");
}

TEST_F(Intake, LengthPastTheEndIsRejectedWithItsByte) {
    // tx_power_info of 5 bytes with 2 present.
    expectRejectedWithoutChange(
        metricRecord(3986178, Bytes{0x08, 0x01, 0x12, 0x05, 0x08, 0x0A}),
        "does not decode as KCellularLteTxPower: length past the end at byte 3");
}

TEST_F(Intake, TruncatedFixedWidthValueIsRejectedWithItsByte) {
    // Unknown field 20 as fixed64 with three bytes.
    expectRejectedWithoutChange(
        metricRecord(3986178, Bytes{0x08, 0x01, 0xA1, 0x01, 0x01, 0x02, 0x03}),
        "does not decode as KCellularLteTxPower: truncated fixed-width value at "
        "byte 4");
}

TEST_F(Intake, UnknownWireTypeIsRejectedWithItsByte) {
    expectRejectedWithoutChange(
        metricRecord(3986178, Bytes{0x08, 0x01, 0x4F}),
        "does not decode as KCellularLteTxPower: unknown wire type at byte 2");
}

TEST_F(Intake, MismatchedEndOfGroupIsRejectedWithItsByte) {
    // Group 23 closed by field 24's end key.
    expectRejectedWithoutChange(metricRecord(3986178, Bytes{0x08, 0x01, 0xBB, 0x01, 0xC4, 0x01}),
                                "does not decode as KCellularLteTxPower: end of group "
                                "does not match its start at byte 4");
}

TEST_F(Intake, GroupWithoutItsEndIsRejectedWithItsByte) {
    expectRejectedWithoutChange(
        metricRecord(3986178, Bytes{0x08, 0x01, 0xBB, 0x01, 0x08, 0x02}),
        "does not decode as KCellularLteTxPower: group without its end at byte 2");
}

TEST_F(Intake, MetricIDIsTheLastProcessedEvenWhenRejected) {
    EXPECT_FALSE(validator->metricID());
    validator->metricsDidUpdate(metricRecord(3986177, Bytes{}));
    EXPECT_EQ(validator->metricID(), std::int64_t{3986177});
    EXPECT_THROW(validator->metricsDidUpdate(metricRecord(3986178, Bytes{0x08, 0xFF})),
                 MetricRejected);
    EXPECT_EQ(validator->metricID(), std::int64_t{3986178});
}

TEST_F(Intake, OnlyTheArrivingKindsPropertyAndHolderChange) {
    fillStore();
    const StoreSnapshot before(*validator);
    validator->metricsDidUpdate(metricRecord(3985667, testing::wcdmaTxPower()));
    const StoreSnapshot after(*validator);
    const auto changed =
        static_cast<std::size_t>(MetricValidator::DictionaryProperty::myUMTSTxPowerDict);
    for (std::size_t i = 0; i < MetricValidator::kDictionaryPropertyCount; ++i) {
        if (i != changed) {
            EXPECT_EQ(after.dictionaries[i], before.dictionaries[i]) << i;
        }
    }
    EXPECT_EQ(after.lte, before.lte);
    EXPECT_EQ(after.gsm, before.gsm);
    EXPECT_EQ(after.common, before.common);
    EXPECT_EQ(after.umts.rXInfo, before.umts.rXInfo);
    EXPECT_EQ(after.umts.TxPower, (EntryList{Dict{{"pusch_tx_power", Value(21)}}}));
}

TEST_F(Intake, ScellInfoBandwidthsAreStoredHalved) {
    validator->metricsDidUpdate(metricRecord(3948738, testing::lteScellInfo(100, 15)));
    EXPECT_EQ(*validator->myLTESCellInfoDict()->find("dl_bw"), Value(std::int64_t{50}));
    EXPECT_EQ(*validator->myLTESCellInfoDict()->find("ul_bw"), Value(std::int64_t{7}));
}

TEST_F(Intake, NeighbourMeasurementsReachHolderAndDictionaryInDisplayUnits) {
    validator->metricsDidUpdate(metricRecord(3986191, testing::lteNbrEutraMeas(97, 34)));
    const Dict expected{{"nbr_earfcn", Value(1300U)},
                        {"nbr_rsrp", Value(std::int64_t{-43})},
                        {"nbr_rsrq", Value(-2.5F)}};
    EXPECT_EQ(validator->myLTE().EutraNbrsMeas, EntryList{expected});
    EXPECT_EQ(validator->myLTEIntraRatMeasDict()->find("meas_nbr_eutra")->asArray().at(0),
              Value(expected));
}

TEST_F(Intake, ArrivalWithoutAListEmptiesItsHolderList) {
    validator->metricsDidUpdate(metricRecord(3986191, testing::lteNbrEutraMeas(97, 34)));
    ASSERT_EQ(validator->myLTE().EutraNbrsMeas.size(), 1U);
    validator->metricsDidUpdate(
        metricRecord(3986191, testing::timestampOnly<KCellularLteNbrEutraCellMeas>()));
    EXPECT_TRUE(validator->myLTE().EutraNbrsMeas.empty());
}

TEST_F(Intake, EmmContextKeepsGutiAndTaiListAsDecoded) {
    const Bytes payload = testing::emmContext();
    validator->metricsDidUpdate(metricRecord(3986700, payload));
    Dict decoded = KCellularEmmContext::initWithData(payload)->dictionaryRepresentation();
    decoded.set("timestamp", Value(kTimestampText));
    EXPECT_EQ(*validator->myLTEEMMContextDict(), decoded);
}

TEST_F(Intake, MetricsDidUpdateLetsTheRejectionThrough) {
    EXPECT_THROW(validator->metricsDidUpdate(MetricRecord{}), MetricRejected);
}

// A store whose validation is replaced by a subclass, and whose setter is watched.
class WatchedValidator : public MetricValidator {
  public:
    WatchedValidator() : MetricValidator(nullptr) {}
    bool isMetricIDValidWithMetricdict(const MetricRecord& record) override {
        ++validations;
        return replaceValidation ? true : MetricValidator::isMetricIDValidWithMetricdict(record);
    }
    void setDictionary(DictionaryProperty p, std::optional<DisplayDictionary> value) override {
        set.push_back(p);
        MetricValidator::setDictionary(p, std::move(value));
    }
    bool replaceValidation = false;
    int validations = 0;
    std::vector<DictionaryProperty> set;
};

TEST_F(Intake, OverriddenValidationReplacesTheWholeCheck) {
    const auto watched = std::make_shared<WatchedValidator>();
    watched->replaceValidation = true;
    watched->metricsDidUpdate(MetricRecord{});
    EXPECT_EQ(watched->validations, 1);
    EXPECT_EQ(out.lines(), std::vector<std::string>{"Received Valid Metric"});
    EXPECT_FALSE(watched->myLTETxPowerDict());
}

TEST_F(Intake, SubclassSetterSeesTheStoredDictionary) {
    const auto watched = std::make_shared<WatchedValidator>();
    watched->metricsDidUpdate(metricRecord(3986178, testing::lteTxPower()));
    EXPECT_EQ(watched->set, std::vector<MetricValidator::DictionaryProperty>{
                                MetricValidator::DictionaryProperty::myLTETxPowerDict});
    EXPECT_TRUE(watched->myLTETxPowerDict());
}

}  // namespace
}  // namespace pyx
