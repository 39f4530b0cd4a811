#include "metrics/TimestampText.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <ctime>
#include <limits>
#include <optional>
#include <string>

namespace pyx {
namespace {

// Sets the process's time zone for one test and restores it afterwards.
class ZoneScope {
  public:
    explicit ZoneScope(const char* zone) {
        if (const char* old = std::getenv("TZ")) old_ = old;
        ::setenv("TZ", zone, 1);
        ::tzset();
    }
    ~ZoneScope() {
        if (old_) {
            ::setenv("TZ", old_->c_str(), 1);
        } else {
            ::unsetenv("TZ");
        }
        ::tzset();
    }
    ZoneScope(const ZoneScope&) = delete;
    ZoneScope& operator=(const ZoneScope&) = delete;

  private:
    std::optional<std::string> old_;
};

TEST(TimestampText, MillisecondsInUtcGiveGmtTextWithoutTheMilliseconds) {
    const ZoneScope utc("UTC");
    EXPECT_EQ(timestampText(1500000000123.0), "2017-07-14 02:40:00 GMT");
}

TEST(TimestampText, LocalZoneShiftsTheClockAndNamesTheOffset) {
    const ZoneScope india("IST-5:30");  // POSIX form: five and a half hours east of UTC
    EXPECT_EQ(timestampText(1500000000123.0), "2017-07-14 08:10:00 GMT+5:30");
}

TEST(TimestampText, ZoneWestOfUtcGetsMinusSign) {
    const ZoneScope west("MST7");
    EXPECT_EQ(timestampText(1500000000000.0), "2017-07-13 19:40:00 GMT-7");
}

TEST(TimestampText, EachCallConvertsAfresh) {
    {
        const ZoneScope utc("UTC");
        EXPECT_EQ(timestampText(0.0), "1970-01-01 00:00:00 GMT");
    }
    {
        const ZoneScope east("CET-2");
        EXPECT_EQ(timestampText(0.0), "1970-01-01 02:00:00 GMT+2");
    }
}

TEST(TimestampText, OffsetTexts) {
    EXPECT_EQ(gmtOffsetText(0), "GMT");
    EXPECT_EQ(gmtOffsetText(2 * 3600), "GMT+2");
    EXPECT_EQ(gmtOffsetText(-7 * 3600), "GMT-7");
    EXPECT_EQ(gmtOffsetText(5 * 3600 + 30 * 60), "GMT+5:30");
    EXPECT_EQ(gmtOffsetText(-(3 * 3600 + 30 * 60)), "GMT-3:30");
}

TEST(TimestampText, InstantOutsideTheCalendarGivesNothing) {
    EXPECT_FALSE(timestampText(std::numeric_limits<double>::infinity()));
    EXPECT_FALSE(timestampText(std::nan("")));
    EXPECT_FALSE(timestampText(1e300));
}

TEST(TimestampText, LargestUnsignedMillisecondCountStillHasAText) {
    const ZoneScope utc("UTC");
    const auto text = timestampText(static_cast<double>(std::numeric_limits<std::uint64_t>::max()));
    ASSERT_TRUE(text);
    EXPECT_NE(text->find(" GMT"), std::string::npos);
}

}  // namespace
}  // namespace pyx
