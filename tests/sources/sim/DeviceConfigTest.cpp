#include "sources/sim/DeviceConfig.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <iterator>
#include <string>

#include "core/MetricKindList.h"
#include "sources/sim/Drive.h"

namespace {

using pyx::sim::ConfigurationError;
using pyx::sim::DeviceConfig;
using pyx::sim::parseDeviceConfig;
using pyx::sim::ScheduledItem;

// The error a text raises, or a failure when it raises none.
ConfigurationError errorOf(std::string_view text) {
    try {
        parseDeviceConfig(text);
    } catch (const ConfigurationError& error) {
        return error;
    }
    ADD_FAILURE() << "accepted: " << text;
    return ConfigurationError(-1, "accepted");
}

TEST(DeviceConfig, ParsesMetricAndTriggerLinesBetweenCommentsAndBlankLines) {
    const DeviceConfig config = parseDeviceConfig(
        "# a drive\n"
        "\n"
        "metric 0x3C4E04 every 1s   # RRC state\n"
        "  metric\t3932179 every 2min\n"
        "trigger 0x7F0001 every 500ms\n");
    EXPECT_EQ(config.metrics,
              (std::vector<ScheduledItem>{{0x3C4E04, 1000, 3}, {3932179, 120000, 4}}));
    EXPECT_EQ(config.triggers, (std::vector<ScheduledItem>{{0x7F0001, 500, 5}}));
}

TEST(DeviceConfig, WindowsLineEndingsAreAccepted) {
    const DeviceConfig config =
        parseDeviceConfig("metric 0x3C4E04 every 1s\r\nmetric 1 every 1s\r\n");
    EXPECT_EQ(config.metrics.size(), 2U);
}

TEST(DeviceConfig, AnEmptyConfigurationIsRefused) {
    const ConfigurationError error = errorOf("");
    EXPECT_EQ(error.line(), 0);
    EXPECT_STREQ(error.what(), "the configuration is empty");
}

TEST(DeviceConfig, AConfigurationWithoutAnyMetricIsRefused) {
    const ConfigurationError error = errorOf("# nothing\n\ntrigger 0x7F0001 every 1s\n");
    EXPECT_EQ(error.line(), 0);
    EXPECT_STREQ(error.what(), "the configuration lists no metric");
}

TEST(DeviceConfig, AnUnknownWordIsRefusedWithItsLine) {
    const ConfigurationError error = errorOf("metric 0x3C4E04 every 1s\n\nmetrics 1 every 1s\n");
    EXPECT_EQ(error.line(), 3);
    EXPECT_STREQ(error.what(), "line 3: unknown word 'metrics' (expected 'metric' or 'trigger')");
}

TEST(DeviceConfig, AnIncompleteEntryIsRefused) {
    const ConfigurationError error = errorOf("metric 0x3C4E04\n");
    EXPECT_EQ(error.line(), 1);
    EXPECT_STREQ(error.what(),
                 "line 1: 'metric' needs an ID and a period, as in: metric 0x3C4E04 every 1s");
}

TEST(DeviceConfig, AMalformedIDIsRefused) {
    for (const char* text : {"metric 0x3C4Z04 every 1s", "metric -5 every 1s", "metric 0 every 1s",
                             "metric 0x every 1s", "metric 0x8000000000000000 every 1s"}) {
        const ConfigurationError error = errorOf(text);
        EXPECT_EQ(error.line(), 1) << text;
        EXPECT_NE(std::string(error.what()).find("is not an ID"), std::string::npos) << text;
    }
}

TEST(DeviceConfig, AMissingEveryIsRefused) {
    const ConfigurationError error = errorOf("metric 0x3C4E04 each 1s\n");
    EXPECT_STREQ(error.what(), "line 1: expected 'every' after the ID, found 'each'");
}

TEST(DeviceConfig, AMalformedPeriodIsRefused) {
    for (const char* text : {"metric 1 every 1h", "metric 1 every s", "metric 1 every 1.5s",
                             "metric 1 every -1s", "metric 1 every 99999999999min"}) {
        const ConfigurationError error = errorOf(text);
        EXPECT_NE(std::string(error.what()).find("is not a period"), std::string::npos) << text;
    }
}

TEST(DeviceConfig, APeriodShorterThanTheShortestIsRefused) {
    const ConfigurationError error = errorOf("metric 1 every 50ms\n");
    EXPECT_STREQ(error.what(), "line 1: the period 50ms is shorter than 100ms");
}

TEST(DeviceConfig, ATrailingWordIsRefused) {
    const ConfigurationError error = errorOf("metric 1 every 1s please\n");
    EXPECT_STREQ(error.what(), "line 1: unexpected 'please' after the period");
}

TEST(DeviceConfig, AnIDListedTwiceIsRefusedNamingTheFirstLine) {
    const ConfigurationError error = errorOf("metric 0x3C4E04 every 1s\nmetric 3952132 every 2s\n");
    EXPECT_EQ(error.line(), 2);
    EXPECT_STREQ(error.what(), "line 2: metric 0x3C4E04 is listed twice (first on line 1)");
}

TEST(DeviceConfig, TheSameIDMayBeAMetricAndATrigger) {
    EXPECT_NO_THROW(parseDeviceConfig("metric 5 every 1s\ntrigger 5 every 1s\n"));
}

TEST(DeviceConfig, BytesThatAreNotTextAreRefused) {
    const std::string text("metric 1 every 1s\nmet\0ric\n", 25);
    const ConfigurationError error = errorOf(text);
    EXPECT_EQ(error.line(), 2);
    EXPECT_STREQ(error.what(), "line 2: the configuration is not text (byte 0x00)");
}

TEST(DeviceConfig, TheShippedConfigurationListsEveryReportedMetric) {
    std::ifstream in(std::string(PYXON_RESOURCE_DIR) + "/oru_test_lte.deviceconfig");
    ASSERT_TRUE(in) << "resources/oru_test_lte.deviceconfig is missing";
    const std::string text((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    const DeviceConfig config = parseDeviceConfig(text);
    std::vector<std::int64_t> ids;
    for (const auto& item : config.metrics) ids.push_back(item.id);
    std::sort(ids.begin(), ids.end());
    std::vector<std::int64_t> reported;
#define PYX_REPORTED_ID(constant, id, ...) \
    if (pyx::sim::Drive::reports(id)) reported.push_back(id);
    PYX_METRIC_KINDS(PYX_REPORTED_ID)
#undef PYX_REPORTED_ID
    std::sort(reported.begin(), reported.end());
    EXPECT_EQ(ids, reported);
    EXPECT_FALSE(config.triggers.empty());
}

}  // namespace
