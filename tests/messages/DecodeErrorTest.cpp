// Why a payload does not decode: every reason the reader gives, with the byte where it stands,
// and what it does not refuse.
#include <gtest/gtest.h>

#include <optional>

#include "TestBytes.h"
#include "messages/Messages.h"

namespace pyx {
namespace {

using test::bytes;
using test::key;
using test::operator+;
using Reason = DecodeError::Reason;

// The failure of reading in as class M, or nothing when it reads.
template <class M>
std::optional<DecodeError> failureOf(const Bytes& in) {
    PBDataReader reader(in);
    M message;
    const bool read = message.readFrom(reader);
    EXPECT_EQ(read, !reader.hasError()) << "a refusal always says why";
    return reader.error();
}

// ---- Truncated varint ----

TEST(DecodeError, TruncatedVarintInAValueIsReportedAtItsFirstByte) {
    // timestamp 5, then state with a varint cut after one byte.
    EXPECT_EQ(failureOf<KCellularLteRrcState>(bytes({0x08, 0x05, 0x10, 0x83})),
              DecodeError(Reason::TruncatedVarint, 3));
}

TEST(DecodeError, ValueMissingAfterTheLastKeyIsReportedAtTheEnd) {
    EXPECT_EQ(failureOf<KCellularLteRrcState>(bytes({0x08, 0x05, 0x10})),
              DecodeError(Reason::TruncatedVarint, 3));
    EXPECT_EQ(failureOf<KCellularLteRrcState>(key(20, 1)), DecodeError(Reason::TruncatedFixed, 2));
}

TEST(DecodeError, TruncatedVarintInAKeyIsReportedAtItsFirstByte) {
    EXPECT_EQ(failureOf<KCellularLteRrcState>(bytes({0x08, 0x05, 0x80})),
              DecodeError(Reason::TruncatedVarint, 2));
}

TEST(DecodeError, TruncatedVarintInALengthIsReportedAtItsFirstByte) {
    // rx_info (3) whose length is cut.
    EXPECT_EQ(failureOf<KCellularLteServingCellMeasurement>(bytes({0x08, 0x01, 0x1A, 0x85})),
              DecodeError(Reason::TruncatedVarint, 3));
}

TEST(DecodeError, TruncatedVarintOfTheMetricTagValue) {
    // 0xD302 is the metric tag of the LTE transmit power kind: its value is cut.
    EXPECT_EQ(failureOf<KCellularLteTxPower>(key(0xD302, 0) + bytes({0xFF})),
              DecodeError(Reason::TruncatedVarint, 3));
}

TEST(DecodeError, TruncatedVarintInsideAPackedList) {
    // multi_band_info (2) packed: 1, then a value cut at the end of the list's two bytes.
    EXPECT_EQ(failureOf<KCellularLteSelReselCellInfo>(bytes({0x08, 0x07, 0x12, 0x02, 0x01, 0x81})),
              DecodeError(Reason::TruncatedVarint, 5));
}

TEST(DecodeError, TruncatedVarintInsideANestedRecordCountsFromThePayloadStart) {
    // timestamp 1, rx_info of 3 bytes: rssi 1, then rsrp_range cut at the record's end (the
    // payload goes on, the record does not).
    const Bytes in = bytes({0x08, 0x01, 0x1A, 0x03, 0x08, 0x02, 0x10, 0x90, 0x01});
    EXPECT_EQ(failureOf<KCellularLteServingCellMeasurement>(in),
              DecodeError(Reason::TruncatedVarint, 7));
}

// ---- Length past the end ----

TEST(DecodeError, BytesLongerThanThePayload) {
    // imsi (2) of 5 bytes with two present.
    EXPECT_EQ(failureOf<KCellularMmCommonInfo>(bytes({0x12, 0x05, 0x01, 0x02})),
              DecodeError(Reason::LengthPastEnd, 1));
}

TEST(DecodeError, TextLongerThanThePayload) {
    // call_id (3) of 4 bytes with one present.
    EXPECT_EQ(failureOf<KCellularLteRsrpRsrqSinr>(bytes({0x08, 0x02, 0x1A, 0x04, 0x41})),
              DecodeError(Reason::LengthPastEnd, 3));
}

TEST(DecodeError, NestedRecordLongerThanThePayload) {
    EXPECT_EQ(
        failureOf<KCellularLteServingCellMeasurement>(bytes({0x08, 0x01, 0x1A, 0x05, 0x08, 0x01})),
        DecodeError(Reason::LengthPastEnd, 3));
}

TEST(DecodeError, PackedListLongerThanThePayload) {
    EXPECT_EQ(failureOf<KCellularLteSelReselCellInfo>(bytes({0x12, 0x04, 0x01})),
              DecodeError(Reason::LengthPastEnd, 1));
}

TEST(DecodeError, SkippedValueLongerThanThePayload) {
    EXPECT_EQ(failureOf<KCellularLteRrcState>(key(20, 2) + bytes({5, 1})),
              DecodeError(Reason::LengthPastEnd, 2));
}

TEST(DecodeError, LengthPastTheEndOfTheEnclosingRecord) {
    // rx_info of 2 bytes holding a key of an unknown field (9, delimited) whose length 1 would
    // take the byte after the record.
    const Bytes in = bytes({0x1A, 0x02, 0x4A, 0x01, 0x00});
    EXPECT_EQ(failureOf<KCellularLteServingCellMeasurement>(in),
              DecodeError(Reason::LengthPastEnd, 3));
}

// ---- Truncated fixed-width value ----

TEST(DecodeError, SkippedFixed64CutShort) {
    EXPECT_EQ(failureOf<KCellularLteRrcState>(key(20, 1) + bytes({1, 2, 3})),
              DecodeError(Reason::TruncatedFixed, 2));
}

TEST(DecodeError, SkippedFixed32CutShort) {
    EXPECT_EQ(failureOf<KCellularLteRrcState>(bytes({0x08, 0x01}) + key(20, 5) + bytes({1, 2, 3})),
              DecodeError(Reason::TruncatedFixed, 4));
}

// ---- Unknown wire type ----

TEST(DecodeError, UnknownWireTypeIsReportedAtItsKey) {
    EXPECT_EQ(failureOf<KCellularLteRrcState>(bytes({0x08, 0x01}) + key(9, 7)),
              DecodeError(Reason::UnknownWireType, 2));
    EXPECT_EQ(failureOf<KCellularLteRrcState>(key(9, 6)), DecodeError(Reason::UnknownWireType, 0));
}

TEST(DecodeError, UnknownWireTypeInsideANestedRecord) {
    // The nested RxInfo holds a key with wire type 7 at byte 2.
    EXPECT_EQ(failureOf<KCellularLteServingCellMeasurement>(bytes({0x1A, 0x01, 0x4F})),
              DecodeError(Reason::UnknownWireType, 2));
}

TEST(DecodeError, UnknownWireTypeInsideASkippedGroup) {
    EXPECT_EQ(failureOf<KCellularLteRrcState>(key(23, 3) + key(9, 6) + key(23, 4)),
              DecodeError(Reason::UnknownWireType, 2));
}

// ---- Groups ----

TEST(DecodeError, GroupClosedByAnotherFieldsEnd) {
    // Group 23 opened at byte 0 (two-byte key), closed by field 24's end key at byte 2.
    EXPECT_EQ(failureOf<KCellularLteRrcState>(key(23, 3) + key(24, 4)),
              DecodeError(Reason::UnmatchedEndGroup, 2));
}

TEST(DecodeError, GroupWithoutItsEndIsReportedAtItsStart) {
    EXPECT_EQ(failureOf<KCellularLteRrcState>(bytes({0x08, 0x01}) + key(23, 3) + key(1, 0) +
                                              bytes({0x05})),
              DecodeError(Reason::UnterminatedGroup, 2));
}

TEST(DecodeError, InnerGroupWithoutItsEndIsReportedAtTheInnerStart) {
    EXPECT_EQ(failureOf<KCellularLteRrcState>(key(23, 3) + key(24, 3)),
              DecodeError(Reason::UnterminatedGroup, 2));
}

// ---- What is not refused ----

TEST(DecodeError, TextThatIsNotUtf8IsAbsentNotRefused) {
    EXPECT_EQ(failureOf<KCellularLteRsrpRsrqSinr>(bytes({0x1A, 0x02, 0xC3, 0x28})), std::nullopt);
}

TEST(DecodeError, KnownFieldWithAnotherWireTypeIsReadAsItsOwnTypeNotRefused) {
    // state (2) sent as fixed32: read as a varint (the next byte), then field 0 with wire type 0.
    EXPECT_EQ(failureOf<KCellularLteRrcState>(key(2, 5) + bytes({0x01, 0x00, 0x00})), std::nullopt);
}

TEST(DecodeError, TheFirstFailureIsKept) {
    const Bytes in = bytes({0x80});
    PBDataReader reader(in);
    reader.readVarint();
    reader.fail(Reason::LengthPastEnd, 0);
    EXPECT_EQ(reader.error(), DecodeError(Reason::TruncatedVarint, 0));
}

// ---- In words ----

TEST(DecodeError, TextNamesTheReasonAndTheByte) {
    EXPECT_EQ(DecodeError(Reason::TruncatedVarint, 12).text(), "truncated varint at byte 12");
    EXPECT_EQ(DecodeError(Reason::LengthPastEnd, 0).text(), "length past the end at byte 0");
    EXPECT_EQ(DecodeError(Reason::TruncatedFixed, 3).text(),
              "truncated fixed-width value at byte 3");
    EXPECT_EQ(DecodeError(Reason::UnknownWireType, 7).text(), "unknown wire type at byte 7");
    EXPECT_EQ(DecodeError(Reason::UnmatchedEndGroup, 2).text(),
              "end of group does not match its start at byte 2");
    EXPECT_EQ(DecodeError(Reason::UnterminatedGroup, 1).text(), "group without its end at byte 1");
}

}  // namespace
}  // namespace pyx
