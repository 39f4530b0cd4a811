// Records found by fuzzing the intake, kept as tests.
#include <gtest/gtest.h>

#include <cstdint>
#include <limits>
#include <memory>

#include "core/Log.h"
#include "metrics/MetricValidator.h"

namespace pyx {
namespace {

// A mutated GSM connected-mode measurement: unknown fields of odd wire types around a
// timestamp; it decodes.
const Bytes kMutatedCsRfPayload = {
    0xa9, 0x30, 0x3a, 0x38, 0x1e, 0xd4, 0x51, 0x16, 0x01, 0x10, 0x0b, 0x08, 0xa8, 0xee, 0xe2, 0x88,
    0xfd, 0x31, 0x12, 0x0b, 0x08, 0x9c, 0x31, 0x10, 0x76, 0x18, 0xee, 0xe2, 0x88, 0xfd, 0x31, 0x12,
    0x0b, 0x08, 0x9c, 0x31, 0x10, 0x76, 0x18, 0x14, 0x20, 0x4c, 0x28, 0x20, 0x12, 0x14, 0x20, 0x48,
    0x28, 0x06, 0x9c, 0x31, 0x10, 0x3e, 0xf6, 0x04, 0x14, 0x20, 0x4a, 0x14, 0x20, 0x4c, 0x28, 0x20,
    0x12, 0x14, 0x20, 0x48, 0x28, 0x06, 0x12, 0x3a, 0xf6, 0x14, 0xf6, 0x25, 0x28, 0x0e};

Dict record(Value metricID, const Bytes& payload) {
    Dict r;
    r.append("kKeyMetricID", std::move(metricID));
    r.append("kKeyPayload", Value(payload));
    return r;
}

TEST(IntakeRegression, UnsignedMetricIDIsTakenLikeTheSignedOne) {
    const CapturedLines out(standardOutputSink());
    const auto unsignedStore = MetricValidator::create(nullptr);
    const auto signedStore = MetricValidator::create(nullptr);

    EXPECT_TRUE(unsignedStore->isMetricIDValidWithMetricdict(
        record(Value(std::uint64_t{3985411}), kMutatedCsRfPayload)));
    EXPECT_TRUE(signedStore->isMetricIDValidWithMetricdict(
        record(Value(std::int64_t{3985411}), kMutatedCsRfPayload)));

    ASSERT_TRUE(unsignedStore->myGSMConnRfMeasDict().has_value());
    EXPECT_EQ(unsignedStore->myGSMConnRfMeasDict(), signedStore->myGSMConnRfMeasDict());
    EXPECT_EQ(unsignedStore->metricID(), std::optional<std::int64_t>(3985411));
    EXPECT_TRUE(out.contains("Metric ID in Hex = 3CD003"));
}

TEST(IntakeRegression, UnsignedMetricIDBeyondTheSignedRangeIsRefusedAndChangesNothing) {
    const CapturedLines out(standardOutputSink());
    const auto store = MetricValidator::create(nullptr);
    ASSERT_TRUE(store->isMetricIDValidWithMetricdict(
        record(Value(std::int64_t{3985411}), kMutatedCsRfPayload)));
    const auto before = store->myGSMConnRfMeasDict();

    const std::uint64_t tooLarge =
        static_cast<std::uint64_t>(std::numeric_limits<std::int64_t>::max()) + 3985411;
    EXPECT_THROW(store->isMetricIDValidWithMetricdict(record(Value(tooLarge), Bytes{0x08, 0x01})),
                 MetricRejected);
    EXPECT_EQ(store->myGSMConnRfMeasDict(), before);
    EXPECT_EQ(store->myGSM(), GSMListHolder{});
}

}  // namespace
}  // namespace pyx
