// The reader loop, the writer and the common message operations, on hand-made bytes.
#include <gtest/gtest.h>

#include <memory>
#include <vector>

#include "TestBytes.h"
#include "core/Log.h"
#include "messages/Messages.h"

namespace pyx {
namespace {

using test::bytes;
using test::key;
using test::operator+;

// ---- Reading ----

TEST(MessageReader, EmptyPayloadReadsSuccessfullyAndGivesEmptyDictionary) {
    const auto m = KCellularLteRrcState::initWithData(Bytes{});
    ASSERT_TRUE(m.has_value());
    EXPECT_TRUE(m->dictionaryRepresentation().empty());
}

TEST(MessageReader, PayloadOfOnlyTheClassMetricTagStoresNothingAndLogsUnknownTag) {
    CapturedLines log(systemLogSink());
    // 0xD302 is the metric tag of the LTE transmit power kind.
    const auto m = KCellularLteTxPower::initWithData(key(0xD302, 0) + bytes({0x07}));
    ASSERT_TRUE(m.has_value());
    EXPECT_TRUE(m->dictionaryRepresentation().empty());
    EXPECT_EQ(m->hash(), 0U);
    EXPECT_TRUE(log.contains("valid metricId tag"));
    EXPECT_TRUE(log.contains("Unknown tag: d302:7"));
}

TEST(MessageReader, MetricTagValueIsReadAsVarintWhateverItsWireType) {
    CapturedLines log(systemLogSink());
    // Tag 19 sent as length-delimited: the "length" 2 is taken as the value, and the two bytes
    // after it are read as the next field (timestamp 9).
    const auto m = KCellularLteRrcState::initWithData(key(19, 2) + bytes({0x02, 0x08, 0x09}));
    ASSERT_TRUE(m.has_value());
    EXPECT_TRUE(log.contains("Unknown tag: 13:2"));
    EXPECT_EQ(m->timestamp(), 9U);
}

TEST(MessageReader, KeyWithWireTypeFourEndsReadingSuccessfully) {
    const auto m =
        KCellularLteRrcState::initWithData(bytes({0x08, 0x05, 0x14, 0xFF, 0xFF, 0x10, 0x01}));
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->timestamp(), 5U);
    EXPECT_FALSE(m->hasState());
}

TEST(MessageReader, VarintFieldSentLengthDelimitedIsReadAsVarint) {
    // prev_state_dur_ms (4) with wire type 2: the length byte 5 is the value.
    const auto m = KCellularLteRrcState::initWithData(key(4, 2) + bytes({0x05, 0x08, 0x07}));
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->prevStateDurMs(), 5U);
    EXPECT_EQ(m->timestamp(), 7U);
}

TEST(MessageReader, RepeatedScalarAcceptsPackedAndUnpackedAndIsWrittenPacked) {
    // Packed [1, 2], then 3 unpacked, then packed [4].
    const Bytes in = key(2, 2) + bytes({0x02, 0x01, 0x02}) + key(2, 0) + bytes({0x03}) + key(2, 2) +
                     bytes({0x01, 0x04});
    const auto m = KCellularLteSelReselCellInfo::initWithData(in);
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->multiBandInfos(), (std::vector<std::uint32_t>{1, 2, 3, 4}));
    EXPECT_EQ(m->data(), key(2, 2) + bytes({0x04, 0x01, 0x02, 0x03, 0x04}));
}

TEST(MessageReader, RepeatedScalarKeyIsPresentAsEmptyArrayWhenNoValueWasRead) {
    const auto m = KCellularLteSelReselCellInfo::initWithData(bytes({0x08, 0x01}));
    ASSERT_TRUE(m.has_value());
    const Dict dict = m->dictionaryRepresentation();
    const Value* v = dict.find("multi_band_info");
    ASSERT_NE(v, nullptr);
    EXPECT_EQ(*v, Value(Array{}));
}

TEST(MessageReader, EnumFieldHoldingZeroShowsTheNameOfZero) {
    const auto m = KCellularLteRrcState::initWithData(bytes({0x10, 0x00}));
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->dictionaryRepresentation(), (Dict{{"state", "KLTE_RRC_STATE_NULL"}}));
}

TEST(MessageReader, EnumFieldHoldingUnlistedValueShowsUnknown) {
    const auto m = KCellularLteRrcState::initWithData(bytes({0x10, 99}));
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->state(), 99);
    EXPECT_EQ(m->dictionaryRepresentation(), (Dict{{"state", "(unknown: 99)"}}));
}

TEST(MessageReader, EnumOutsideItsTableIsWrittenBackUnchanged) {
    const Bytes in = bytes({0x10, 99, 0x28, 0xFE, 0xFF, 0xFF, 0xFF, 0x0F});  // cause 0xFFFFFFFE
    const auto m = KCellularLteRrcState::initWithData(in);
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->cause(), -2);
    // The writer sign-extends: -2 as ten bytes.
    EXPECT_EQ(m->data(),
              bytes({0x10, 99, 0x28, 0xFE, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0x01}));
}

TEST(MessageReader, TruncatedVarintFailsAndTheFieldBeingReadGetsZero) {
    const Bytes in = bytes({0x08, 0x05, 0x10, 0x83});
    PBDataReader reader(in);
    KCellularLteRrcState m;
    EXPECT_FALSE(m.readFrom(reader));
    EXPECT_TRUE(reader.hasError());
    EXPECT_EQ(m.timestamp(), 5U);
    EXPECT_TRUE(m.hasState());
    EXPECT_EQ(m.state(), 0);
}

TEST(MessageReader, TruncatedKeyFails) {
    EXPECT_FALSE(KCellularLteRrcState::initWithData(bytes({0x08, 0x05, 0x80})).has_value());
}

TEST(MessageReader, NestedLengthBeyondTheEndFailsAndKeepsThePartialSubmessage) {
    const Bytes in = bytes({0x08, 0x01, 0x1A, 0x05, 0x08, 0x01});
    PBDataReader reader(in);
    KCellularLteServingCellMeasurement m;
    EXPECT_FALSE(m.readFrom(reader));
    EXPECT_EQ(m.timestamp(), 1U);
    ASSERT_EQ(m.rxInfosCount(), 1U);
    EXPECT_FALSE(m.rxInfoAtIndex(0)->hasRssi());
}

TEST(MessageReader, FailingNestedRecordFailsTheContainer) {
    // The nested RxInfo holds a key with wire type 7.
    EXPECT_FALSE(KCellularLteServingCellMeasurement::initWithData(bytes({0x1A, 0x01, 0x4F})));
}

TEST(MessageReader, EndGroupInsideNestedRecordEndsOnlyThatRecord) {
    // The RxInfo stops at its end-group key; the container takes its sub-reader back and goes
    // on from where the nested reader stopped (here: the rest of the record, field 2 = 9).
    const Bytes in = bytes({0x1A, 0x05, 0x08, 0x02, 0x0C, 0x10, 0x09, 0x08, 0x04});
    const auto m = KCellularLteServingCellMeasurement::initWithData(in);
    ASSERT_TRUE(m.has_value());
    ASSERT_EQ(m->rxInfosCount(), 1U);
    EXPECT_EQ(m->rxInfoAtIndex(0)->rssi(), 1);
    EXPECT_FALSE(m->rxInfoAtIndex(0)->hasRsrpRange());
    EXPECT_TRUE(m->isConnectedMode());
    EXPECT_EQ(m->timestamp(), 4U);
}

TEST(MessageReader, AListInterruptedByAnotherFieldKeepsEveryElementInOrder) {
    // rxInfo rssi 1, rxInfo rssi 2, timestamp 4, rxInfo rssi 3.
    const Bytes in =
        bytes({0x1A, 0x02, 0x08, 0x02, 0x1A, 0x02, 0x08, 0x04, 0x08, 0x04, 0x1A, 0x02, 0x08, 0x06});
    const auto m = KCellularLteServingCellMeasurement::initWithData(in);
    ASSERT_TRUE(m.has_value());
    ASSERT_EQ(m->rxInfosCount(), 3U);
    for (std::size_t i = 0; i < 3; ++i)
        EXPECT_EQ(m->rxInfoAtIndex(i)->rssi(), static_cast<std::int32_t>(i + 1));
    EXPECT_EQ(m->timestamp(), 4U);
}

TEST(MessageReader, ALongRunOfElementsIsReadWhole) {
    Bytes in;
    for (int i = 0; i < 2000; ++i) {
        const Bytes element = bytes({0x1A, 0x02, 0x08, static_cast<std::uint8_t>(2 * (i % 60))});
        in.insert(in.end(), element.begin(), element.end());
    }
    const auto m = KCellularLteServingCellMeasurement::initWithData(in);
    ASSERT_TRUE(m.has_value());
    ASSERT_EQ(m->rxInfosCount(), 2000U);
    for (std::size_t i = 0; i < 2000; ++i)
        ASSERT_EQ(m->rxInfoAtIndex(i)->rssi(), static_cast<std::int32_t>(i % 60)) << i;
}

TEST(MessageReader, UnknownTagWithUnknownWireTypeFails) {
    EXPECT_FALSE(KCellularLteRrcState::initWithData(key(9, 7)).has_value());
    EXPECT_FALSE(KCellularLteRrcState::initWithData(key(9, 6)).has_value());
}

TEST(MessageReader, UnknownTagsOfEveryKnownWireTypeAreSkipped) {
    const Bytes in = key(20, 0) + bytes({0x96, 0x01}) +              // varint
                     key(21, 1) + bytes({1, 2, 3, 4, 5, 6, 7, 8}) +  // fixed64
                     key(22, 2) + bytes({0x02, 0xAA, 0xBB}) +        // delimited
                     key(23, 3) + key(1, 0) + bytes({0x05}) + key(24, 3) + key(24, 4) +
                     key(23, 4) +                        // groups
                     key(25, 5) + bytes({1, 2, 3, 4}) +  // fixed32
                     bytes({0x10, 0x03});
    const auto m = KCellularLteRrcState::initWithData(in);
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->dictionaryRepresentation(), (Dict{{"state", "KLTE_RRC_STATE_CONNECTED"}}));
}

TEST(MessageReader, GroupWithMismatchedEndFails) {
    EXPECT_FALSE(KCellularLteRrcState::initWithData(key(23, 3) + key(24, 4)).has_value());
    EXPECT_FALSE(KCellularLteRrcState::initWithData(key(23, 3) + key(1, 0)).has_value());
}

TEST(MessageReader, SkippedValueRunningPastTheEndFails) {
    EXPECT_FALSE(KCellularLteRrcState::initWithData(key(20, 1) + bytes({1, 2, 3})).has_value());
    EXPECT_FALSE(KCellularLteRrcState::initWithData(key(20, 5) + bytes({1, 2, 3})).has_value());
    EXPECT_FALSE(KCellularLteRrcState::initWithData(key(20, 2) + bytes({5, 1})).has_value());
}

TEST(MessageReader, FieldNumberIsTruncatedTo16Bits) {
    // Field number 0x10002 is read as field 2 (state).
    const auto m = KCellularLteRrcState::initWithData(key(0x10002, 0) + bytes({0x01}));
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->state(), KLTE_RRC_STATE_IDLE);
}

TEST(MessageReader, TenByteVarintWithoutEndReadsAsZero) {
    Bytes in = bytes({0x08});
    for (int i = 0; i < 10; ++i) in.push_back(0xFF);
    in = in + bytes({0x10, 0x03});
    const auto m = KCellularLteRrcState::initWithData(in);
    ASSERT_TRUE(m.has_value());
    EXPECT_TRUE(m->hasTimestamp());
    EXPECT_EQ(m->timestamp(), 0U);
    EXPECT_EQ(m->state(), KLTE_RRC_STATE_CONNECTED);
}

TEST(MessageReader, ScalarArrivingTwiceKeepsTheLastValue) {
    const auto m = KCellularLteRrcState::initWithData(bytes({0x08, 0x01, 0x08, 0x02}));
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->timestamp(), 2U);
}

TEST(MessageReader, BoolIsTrueForAnyNonZeroVarint) {
    const auto m = KCellularLteServingCellMeasurement::initWithData(bytes({0x10, 0x80, 0x02}));
    ASSERT_TRUE(m.has_value());
    EXPECT_TRUE(m->isConnectedMode());
    EXPECT_EQ(m->dictionaryRepresentation(), (Dict{{"is_connected_mode", true}}));
}

TEST(MessageReader, Uint32AndEnumKeepTheLow32Bits) {
    // 0x1_0000_0005 for prev_state_dur_ms and state.
    const Bytes big = bytes({0x85, 0x80, 0x80, 0x80, 0x10});
    const auto m = KCellularLteRrcState::initWithData(key(4, 0) + big + key(2, 0) + big);
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->prevStateDurMs(), 5U);
    EXPECT_EQ(m->state(), 5);
}

TEST(MessageReader, Sint32IsZigzagDecoded) {
    const auto m = RxInfo::initWithData(bytes({0x08, 0x8B, 0x01, 0x20, 0x06}));
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->rssi(), -70);
    EXPECT_EQ(m->snr(), 3);
    EXPECT_EQ(m->dictionaryRepresentation(), (Dict{{"rssi", -70}, {"snr", 3}}));
}

TEST(MessageReader, BytesRunningPastTheEndFail) {
    const Bytes in = bytes({0x12, 0x05, 0x01, 0x02});
    PBDataReader reader(in);
    KCellularMmCommonInfo m;
    EXPECT_FALSE(m.readFrom(reader));
    EXPECT_FALSE(m.hasImsi());
}

TEST(MessageReader, TextThatIsNotUtf8IsAbsent) {
    const auto m = KCellularLteRsrpRsrqSinr::initWithData(bytes({0x1A, 0x02, 0xC3, 0x28}));
    ASSERT_TRUE(m.has_value());
    EXPECT_FALSE(m->hasCallId());
    const auto ok = KCellularLteRsrpRsrqSinr::initWithData(bytes({0x1A, 0x02, 0xC3, 0xA9}));
    ASSERT_TRUE(ok.has_value());
    EXPECT_EQ(ok->callId(), std::optional<std::string>("\xC3\xA9"));
}

TEST(MessageReader, BytesFieldArrivingTwiceKeepsTheLast) {
    const auto m = Plmn::initWithData(bytes({0x0A, 0x01, 0xAA, 0x0A, 0x02, 0xBB, 0xCC}));
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->encodedPlmn(), std::optional<Bytes>(bytes({0xBB, 0xCC})));
}

TEST(MessageReader, PackedListRunningPastTheEndFails) {
    EXPECT_FALSE(KCellularLteSelReselCellInfo::initWithData(bytes({0x12, 0x04, 0x01})));
}

// ---- Writing ----

TEST(MessageWriter, WritesNegativeEnumAsTenByteVarint) {
    KCellularLteRrcState m;
    m.setCause(-1);
    EXPECT_EQ(m.data(), bytes({0x28, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0x01}));
}

TEST(MessageWriter, WritesSint32AsZigzag) {
    RxInfo m;
    m.setSnr(3);
    m.setRssi(-70);
    m.setRsrpRange(0);
    EXPECT_EQ(m.data(), bytes({0x08, 0x8B, 0x01, 0x10, 0x00, 0x20, 0x06}));
}

TEST(MessageWriter, WritesRepeatedSint32PackedAndZigzag) {
    KCellularGsmCsRfMeasurement m;
    const std::int32_t values[] = {-1, 2, -64};
    m.setCsTxPwrs(values, 3);
    EXPECT_EQ(m.data(), bytes({0x2A, 0x03, 0x01, 0x04, 0x7F}));
}

TEST(MessageWriter, WritesNestedRecordsWithTheirLengths) {
    KCellularLteServingCellMeasurement m;
    auto rx = std::make_shared<RxInfo>();
    rx->setRssi(-1);
    rx->setRsrpRange(300);
    m.addRxInfo(rx);
    m.addRxInfo(std::make_shared<RxInfo>());
    m.setIsConnectedMode(true);
    m.setTimestamp(1);
    EXPECT_EQ(m.data(), bytes({0x08, 0x01, 0x10, 0x01, 0x1A, 0x05, 0x08, 0x01, 0x10, 0xAC, 0x02,
                               0x1A, 0x00}));
}

TEST(MessageWriter, WritesLongNestedRecordWithMultiByteLength) {
    KCellularSimCardFiles m;
    auto ef = std::make_shared<ElementaryFile>();
    ef->setContent(Bytes(200, 0x5A));
    m.addEfList(ef);
    const Bytes out = m.data();
    // ef_list: key 0x12, length 203 (0xCB 0x01); content: key 0x12, length 200 (0xC8 0x01).
    ASSERT_EQ(out.size(), 206U);
    EXPECT_EQ(Bytes(out.begin(), out.begin() + 6), bytes({0x12, 0xCB, 0x01, 0x12, 0xC8, 0x01}));
    EXPECT_TRUE(KCellularSimCardFiles::initWithData(out).value() == m);
}

TEST(MessageWriter, WritesFieldsInSchemaOrderWhateverTheSettingOrder) {
    KCellularLteRrcState m;
    m.setCause(KLTE_RRC_CAUSE_EST_MO_DATA);
    m.setTimestamp(0x80);
    m.setState(KLTE_RRC_STATE_IDLE);
    EXPECT_EQ(m.data(), bytes({0x08, 0x80, 0x01, 0x10, 0x01, 0x28, 0x04}));
}

TEST(MessageWriter, WritesFullWidthUint64) {
    KCellularLteRrcState m;
    m.setTimestamp(0x8000000000000000ULL);
    EXPECT_EQ(m.data(), bytes({0x08, 0x80, 0x80, 0x80, 0x80, 0x80, 0x80, 0x80, 0x80, 0x80, 0x01}));
}

TEST(MessageWriter, WritesNothingForAbsentFieldsAndEmptyLists) {
    KCellularLteServingCellMeasurement m;
    m.setRxInfos({});
    m.setHasTimestamp(false);
    EXPECT_TRUE(m.data().empty());
}

TEST(MessageWriter, KeylessTagWritesTheValueAlone) {
    PBDataWriter w;
    PBDataWriterWriteUint32Field(w, 300, kNoTag);
    PBDataWriterWriteDataField(w, bytes({0x01}), kNoTag);
    EXPECT_EQ(w.data(), bytes({0xAC, 0x02, 0x01, 0x01}));
}

// ---- Field operations ----

TEST(MessageFields, EnumGetterReadsZeroWhileItsBitIsClear) {
    KCellularLteRrcState m;
    m.setState(KLTE_RRC_STATE_CONNECTED);
    m.setHasState(false);
    EXPECT_EQ(m.state(), 0);
    EXPECT_TRUE(m.data().empty());
    m.setHasState(true);
    EXPECT_EQ(m.state(), KLTE_RRC_STATE_CONNECTED);
}

TEST(MessageFields, RepeatedScalarAtIndexOutOfRangeThrowsTypedError) {
    KCellularLteSelReselCellInfo m;
    m.addMultiBandInfo(7);
    m.addMultiBandInfo(8);
    m.addMultiBandInfo(9);
    EXPECT_EQ(m.multiBandInfoAtIndex(2), 9U);
    try {
        (void)m.multiBandInfoAtIndex(3);
        FAIL() << "no exception";
    } catch (const IndexOutOfRange& e) {
        EXPECT_STREQ(e.what(), "idx (3) is out of range (3)");
        EXPECT_EQ(e.index(), 3U);
        EXPECT_EQ(e.count(), 3U);
    }
    m.clearMultiBandInfos();
    EXPECT_EQ(m.multiBandInfosCount(), 0U);
}

TEST(MessageFields, RepeatedMessageAtIndexOutOfRangeThrows) {
    KCellularLteTxPower m;
    EXPECT_THROW((void)m.txPowerInfoAtIndex(0), IndexOutOfRange);
}

TEST(MessageFields, AddingNullToAMessageListIsRefused) {
    KCellularLteTxPower m;
    EXPECT_THROW(m.addTxPowerInfo(nullptr), std::invalid_argument);
    EXPECT_THROW(m.setTxPowerInfos({nullptr}), std::invalid_argument);
    EXPECT_EQ(m.txPowerInfosCount(), 0U);
}

TEST(MessageFields, SetRepeatedScalarsCopiesTheGivenValues) {
    KCellularWcdmaSelReselCellInfo m;
    std::uint32_t values[] = {1, 2};
    m.setMultiBandInfos(values, 2);
    values[0] = 9;
    EXPECT_EQ(m.multiBandInfos(), (std::vector<std::uint32_t>{1, 2}));
}

// ---- Equality, hash, copy, merge, description ----

TEST(MessageEquality, DiffersWhenOnlyPresenceOfAZeroValuedFieldDiffers) {
    KCellularLteRrcState a;
    KCellularLteRrcState b;
    b.setPrevStateDurMs(0);
    EXPECT_FALSE(a.isEqual(b));
    EXPECT_FALSE(a == b);
    b.setHasPrevStateDurMs(false);
    EXPECT_TRUE(a == b);
}

TEST(MessageEquality, HashOfMessageWithNoFieldsSetIsZero) {
    EXPECT_EQ(KCellularLteRrcState().hash(), 0U);
    EXPECT_EQ(KCellularMmCommonInfo().hash(), 0U);
}

TEST(MessageEquality, HashIsTheXorOfTheFieldTerms) {
    KCellularLteRrcState m;
    m.setTimestamp(3);
    m.setCause(-1);
    const std::uint64_t k = 2654435761ULL;
    EXPECT_EQ(m.hash(), (3 * k) ^ (0xFFFFFFFFFFFFFFFFULL * k));
}

TEST(MessageEquality, AbsentMessageListDiffersFromAnEmptyOne) {
    KCellularLteTxPower never;
    KCellularLteTxPower emptied;
    emptied.addTxPowerInfo(std::make_shared<TxPowerInfo>());
    emptied.clearTxPowerInfos();
    EXPECT_EQ(emptied.txPowerInfosCount(), 0U);
    EXPECT_FALSE(never == emptied);
    KCellularLteTxPower setEmpty;
    setEmpty.setTxPowerInfos({});
    EXPECT_TRUE(setEmpty == emptied);
}

TEST(MessageEquality, NestedMessagesCompareByValue) {
    KCellularMmContext a;
    KCellularMmContext b;
    a.setLai(std::make_shared<KCellularLocationAreaId>());
    EXPECT_FALSE(a == b);
    b.setLai(std::make_shared<KCellularLocationAreaId>());
    EXPECT_TRUE(a == b);
    b.lai()->setLac(1);
    EXPECT_FALSE(a == b);
}

TEST(MessageCopy, DeepCopyDoesNotCarryAnEmptyMessageList) {
    KCellularLteTxPower m;
    m.setTxPowerInfos({});
    EXPECT_TRUE(m.copy() == KCellularLteTxPower());
}

TEST(MessageCopy, CopyToLeavesTargetListWhenSourceListIsEmpty) {
    KCellularLteTxPower source;
    KCellularLteTxPower target;
    target.addTxPowerInfo(std::make_shared<TxPowerInfo>());
    source.copyTo(target);
    EXPECT_EQ(target.txPowerInfosCount(), 1U);
}

TEST(MessageCopy, CopyToSharesTheNestedObject) {
    KCellularLteRsrpRsrqSinr source;
    source.setAvgValues(std::make_shared<RsrpRsrqSinr>());
    KCellularLteRsrpRsrqSinr target;
    source.copyTo(target);
    source.avgValues()->setRsrp0(-90);
    EXPECT_EQ(target.avgValues()->rsrp0(), -90);
}

TEST(MessageMerge, MergesIntoAnExistingNestedMessage) {
    KCellularLteRsrpRsrqSinr a;
    auto avg = std::make_shared<RsrpRsrqSinr>();
    avg->setRsrp0(-80);
    avg->setSinr0(5);
    a.setAvgValues(avg);
    KCellularLteRsrpRsrqSinr b;
    auto other = std::make_shared<RsrpRsrqSinr>();
    other->setRsrp0(-90);
    b.setAvgValues(other);
    a.mergeFrom(b);
    EXPECT_EQ(a.avgValues(), avg);
    EXPECT_EQ(avg->rsrp0(), -90);
    EXPECT_EQ(avg->sinr0(), 5);
    EXPECT_FALSE(other->hasSinr0());
}

TEST(MessageMerge, TakesTheNestedMessageWhenItHasNone) {
    KCellularLteRsrpRsrqSinr a;
    KCellularLteRsrpRsrqSinr b;
    b.setAvgValues(std::make_shared<RsrpRsrqSinr>());
    a.mergeFrom(b);
    EXPECT_EQ(a.avgValues(), b.avgValues());
}

TEST(MessageMerge, AppendsRepeatedScalarsAndKeepsAbsentScalars) {
    KCellularLteSelReselCellInfo a;
    a.addMultiBandInfo(1);
    a.setQHyst(4);
    KCellularLteSelReselCellInfo b;
    b.addMultiBandInfo(2);
    a.mergeFrom(b);
    EXPECT_EQ(a.multiBandInfos(), (std::vector<std::uint32_t>{1, 2}));
    EXPECT_EQ(a.qHyst(), 4U);
}

TEST(MessageDescription, IsTheClassAndAddressThenTheDictionary) {
    KCellularLteRrcState m;
    m.setState(KLTE_RRC_STATE_IDLE);
    const std::string text = m.description();
    EXPECT_EQ(text.rfind("<KCellularLteRrcState: 0x", 0), 0U) << text;
    const std::string tail = "> {state: KLTE_RRC_STATE_IDLE}";
    ASSERT_GE(text.size(), tail.size());
    EXPECT_EQ(text.substr(text.size() - tail.size()), tail);
}

// ---- Enumeration tables ----

TEST(EnumerationTables, BandTableHas78NamesSharedByGsmAndWcdma) {
    EXPECT_EQ(kSysBandNames.count, 78U);
    KCellularGsmScellInfo gsm;
    gsm.setGsmBand(SYS_BAND_LTE_EUTRAN_BAND17);
    KCellularWcdmaCellInfo wcdma;
    wcdma.setWcdmaBand(136);
    EXPECT_EQ(test::valueAt(gsm.dictionaryRepresentation(), "gsm_band"),
              Value("SYS_BAND_LTE_EUTRAN_BAND17"));
    EXPECT_EQ(test::valueAt(wcdma.dictionaryRepresentation(), "wcdma_band"),
              Value("SYS_BAND_LTE_EUTRAN_BAND17"));
    for (const int unnamed : {2, 20, 39, 49, 79, 89, 92, 119, 134, 135, 141, 142, 146, 151, 169}) {
        EXPECT_TRUE(kSysBandNames.find(unnamed).empty()) << unnamed;
    }
    EXPECT_EQ(kSysBandNames.nameOf(168), "SYS_BAND_UMTS_BAND6");
    EXPECT_EQ(kSysBandNames.nameOf(-3), "(unknown: -3)");
}

TEST(EnumerationTables, NamedConstantsCarryTheirValues) {
    EXPECT_EQ(KLTE_RRC_CAUSE_NA, 255);
    EXPECT_EQ(KNAS_MM_REJ_CAUSE_PROTOCOL_ERROR_UNSPECIFIED, 111);
    EXPECT_EQ(EMM_CAUSE_NO_EPS_BEARER_CONTEXT_ACTIVATED, 40);
    EXPECT_EQ(TDD, 1);
    EXPECT_EQ(kWcdmaDuplexModeNames.nameOf(TDD), "TDD");
    EXPECT_EQ(kWcdmaDuplexModeNames.nameOf(INVALID), "(unknown: 2)");
    EXPECT_EQ(kNbrEutraFrameTypeNames.nameOf(INVALID), "INVALID");
}

}  // namespace
}  // namespace pyx
