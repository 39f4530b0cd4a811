// The window as the program runs it, in screenshot mode: it renders every screen of the menu
// to PNG files, announces the loaded root view once, and quits with 0.
#include <gtest/gtest.h>
#include <unistd.h>

#include <array>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

#include "metrics/MetricValidator.h"
#include "metrics/history/History.h"
#include "ui/DriveTrack.h"
#include "ui/qt/QtFrontEnd.h"
#include "ui/qt/Screenshots.h"

namespace pyx {
namespace {

struct PngSize {
    std::uint32_t width = 0;
    std::uint32_t height = 0;
};

// The size in a PNG file's header, or zeros for a file that is not a PNG.
PngSize pngSize(const std::filesystem::path& file) {
    std::ifstream in(file, std::ios::binary);
    std::array<unsigned char, 24> head{};
    if (!in.read(reinterpret_cast<char*>(head.data()), head.size())) return {};
    const std::array<unsigned char, 8> signature{0x89, 'P', 'N', 'G', '\r', '\n', 0x1a, '\n'};
    if (!std::equal(signature.begin(), signature.end(), head.begin())) return {};
    const auto bigEndian = [&head](std::size_t at) {
        return (std::uint32_t{head[at]} << 24) | (std::uint32_t{head[at + 1]} << 16) |
               (std::uint32_t{head[at + 2]} << 8) | std::uint32_t{head[at + 3]};
    };
    return {bigEndian(16), bigEndian(20)};
}

TEST(Window, ScreenshotModeRendersEveryScreenThenQuitsWithZero) {
    const auto dir = std::filesystem::temp_directory_path() /
                     ("pyxon-window-" + std::to_string(::getpid())) / "shots";
    std::filesystem::remove_all(dir.parent_path());

    std::string name = "ui_window_tests";
    std::vector<char*> argv{name.data(), nullptr};
    int argc = 1;
    int rootViewLoads = 0;
    MetricValidator::sharedInstance()->setHistory(std::make_shared<History>());
    WindowOptions options;
    options.screenshotDir = dir.string();
    options.screenshotDelayMs = 0;
    options.screenshotChartDelayMs = 0;
    // A short drive, so that the Drive map has points to show.
    auto drive = std::make_shared<DriveTrack>();
    for (int i = 0; i < 30; ++i)
        drive->addPoint(DrivePoint{48.8566 + i * 0.0002, 2.3522 + i * 0.0003,
                                   ServingLevel{"LTE", "RSRP", -80.0 - i, i / 6}});
    options.drive = drive;
    const int status = runWindow(argc, argv.data(), options, [&rootViewLoads] { ++rootViewLoads; });

    EXPECT_EQ(status, 0);
    EXPECT_EQ(rootViewLoads, 1);
    const auto paths = qt::Screenshots::paths();
    std::size_t files = 0;
    for (const auto& entry : std::filesystem::directory_iterator(dir)) {
        (void)entry;
        ++files;
    }
    const auto charts = qt::Screenshots::chartNumbers();
    EXPECT_EQ(files, paths.size() + charts.size() + 1);
    EXPECT_EQ(pngSize(dir / qt::Screenshots::mapFileName().toStdString()).width, 390U);
    for (const int number : charts) {
        const auto file = dir / qt::Screenshots::fileName(
                                    number, paths[static_cast<std::size_t>(number - 1)], true)
                                    .toStdString();
        EXPECT_EQ(pngSize(file).width, 390U) << file;
    }
    for (std::size_t i = 0; i < paths.size(); ++i) {
        const auto file =
            dir / qt::Screenshots::fileName(static_cast<int>(i) + 1, paths[i]).toStdString();
        const PngSize size = pngSize(file);
        EXPECT_EQ(size.width, 390U) << file;
        EXPECT_EQ(size.height, 844U) << file;
    }
    std::filesystem::remove_all(dir.parent_path());
}

}  // namespace
}  // namespace pyx
