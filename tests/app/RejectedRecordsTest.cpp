#include "app/RejectedRecords.h"

#include <gtest/gtest.h>

#include <stdexcept>

#include "core/Log.h"
#include "metrics/MetricValidator.h"

TEST(RejectedRecords, OneLineWithMetricIdAndReasonThenTheQueueGoesOn) {
    pyx::MainQueue queue;
    pyx::CapturedLines log(pyx::systemLogSink());
    int ran = 0;
    {
        const pyx::RejectedRecords rejected(queue);
        queue.post([] { throw pyx::MetricRejected(3986178, "payload does not decode"); });
        queue.post([] { throw pyx::MetricRejected(std::nullopt, "no metric ID"); });
        queue.post([&] { ++ran; });
        queue.drain();
        EXPECT_EQ(rejected.count(), 2U);
        EXPECT_EQ(ran, 1);
    }
    const auto lines = log.lines();
    ASSERT_EQ(lines.size(), 3U);
    EXPECT_NE(lines[0].find("0x3CD302"), std::string::npos) << lines[0];
    EXPECT_NE(lines[0].find("payload does not decode"), std::string::npos) << lines[0];
    EXPECT_NE(lines[1].find("no metric ID"), std::string::npos) << lines[1];
    EXPECT_NE(lines[2].find("2 metric records rejected"), std::string::npos) << lines[2];
}

TEST(RejectedRecords, OtherErrorsStillEndTheRun) {
    pyx::MainQueue queue;
    const pyx::RejectedRecords rejected(queue);
    queue.post([] { throw std::logic_error("a bug"); });
    EXPECT_THROW(queue.drain(), std::logic_error);
    EXPECT_EQ(rejected.count(), 0U);
}

TEST(RejectedRecords, UndecodablePayloadLineSaysWhyAndAtWhichByte) {
    pyx::MainQueue queue;
    pyx::CapturedLines log(pyx::systemLogSink());
    pyx::CapturedLines out(pyx::standardOutputSink());
    const auto validator = pyx::MetricValidator::create(nullptr);
    // An LTE RRC state whose prev_state_dur_ms value is cut at byte 12.
    pyx::MetricRecord record;
    record.append("kKeyMetricID", pyx::Value(std::int64_t{0x3C4E04}));
    record.append("kKeyPayload", pyx::Value(pyx::Bytes{0x08, 0xFB, 0xB0, 0xDE, 0xF7, 0xD3, 0x2B,
                                                       0x10, 0x03, 0x18, 0x01, 0x20, 0x85}));
    {
        const pyx::RejectedRecords rejected(queue);
        queue.post([&] { validator->metricsDidUpdate(record); });
        queue.drain();
    }
    EXPECT_TRUE(
        log.contains("pyxon: rejected metric record 0x3C4E04: does not decode as "
                     "KCellularLteRrcState: truncated varint at byte 12"));
}
