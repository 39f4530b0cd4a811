// What the window's status line says of the GPS, live and in a replay.
#include <gtest/gtest.h>

#include "ui/DriveTrack.h"

namespace pyx {
namespace {

constexpr std::int64_t kNoonNs = 1'795'953'600'000'000'000;  // 2026-11-29 12:00:00 UTC

gps::Fix fixAt(std::int64_t ns) {
    gps::Fix fix;
    fix.timeNs = ns;
    fix.receivedNs = ns;
    fix.mode = gps::FixMode::ThreeD;
    fix.lat = 48.8566;
    fix.lon = 2.3522;
    return fix;
}

TEST(DriveTrack, WithoutGpsdOrFixesItSaysHowToTurnTheGpsOn) {
    const DriveTrack track;
    EXPECT_FALSE(track.gpsOn());
    EXPECT_EQ(track.statusText(kNoonNs), "GPS off (start with --gps)");
}

TEST(DriveTrack, AReplayedFixIsSaidWithItsOwnTimeNotAnAge) {
    DriveTrack track;
    track.addFix(fixAt(kNoonNs + 5'000'000'000));
    EXPECT_TRUE(track.gpsOn());
    // Replayed a day later: the age would say nothing.
    EXPECT_EQ(track.statusText(kNoonNs + 86'400'000'000'000),
              "GPS recorded 3D 48.85660, 2.35220 at 12:00:05 UTC");
    EXPECT_EQ(track.points().size(), 1U);
}

TEST(DriveTrack, ALiveFixIsSaidWithItsAgeAndGoesStaleAfterTwoSeconds) {
    DriveTrack track;
    track.followGpsd([] { return gps::GpsdState::Fix; }, "127.0.0.1:2947");
    EXPECT_EQ(track.statusText(kNoonNs), "GPS: no fix yet");
    track.addFix(fixAt(kNoonNs));
    EXPECT_EQ(track.statusText(kNoonNs + 1'000'000'000), "GPS 3D 48.85660, 2.35220 \u00b7 1 s ago");
    EXPECT_EQ(track.statusText(kNoonNs + 3'000'000'000), "GPS: fix lost 3 s ago");
}

}  // namespace
}  // namespace pyx
