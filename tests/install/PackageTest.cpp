// The Debian package that `scripts/dev package` writes: unpacked with dpkg-deb, it holds the
// programs, the bundle, the desktop files and the manual pages, and it names its dependencies.
#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <set>
#include <string>

#include "tests/support/ProgramRun.h"

namespace {

namespace fs = std::filesystem;
using pyx::test::ProgramRun;

const std::string kAppID = PYXON_APP_ID;
const fs::path kPackage = PYXON_PACKAGE_FILE;

class DebianPackage : public ::testing::Test {
  protected:
    void SetUp() override {
        if (std::string(PYXON_DPKG_DEB).empty())
            GTEST_SKIP() << "dpkg-deb not found: cannot read the package";
        if (!fs::is_regular_file(kPackage))
            GTEST_SKIP() << "no package at " << kPackage << ": `scripts/dev package` builds it";
        // Nothing rebuilds the package when the programs change: an older one would be tested
        // for what this build no longer is.
        const fs::path program = PYXON_BINARY;
        if (fs::last_write_time(kPackage) < fs::last_write_time(program))
            FAIL() << "the package " << kPackage << " is older than this build's " << program
                   << ": it does not hold the programs built now; rebuild it with "
                      "`scripts/dev package`";
    }
};

TEST_F(DebianPackage, IsNamedAfterTheProjectVersion) {
    EXPECT_EQ(kPackage.filename().string().rfind(std::string("pyxon_") + PYXON_VERSION + "_", 0),
              0U)
        << kPackage;
}

TEST_F(DebianPackage, HoldsTheProgramsTheBundleTheDesktopFilesAndTheManualPages) {
    const fs::path scratch =
        fs::path(::testing::TempDir()) / ("pyxon_deb_" + std::to_string(::getpid()));
    fs::remove_all(scratch);
    const ProgramRun unpack =
        ProgramRun::of({PYXON_DPKG_DEB, "-x", kPackage.string(), scratch.string()});
    ASSERT_EQ(unpack.exitCode, 0) << unpack.err;

    std::set<std::string> files;
    for (const auto& entry : fs::recursive_directory_iterator(scratch))
        if (!entry.is_directory()) files.insert(entry.path().lexically_relative(scratch).string());
    const std::set<std::string> expected{
        "usr/bin/pyxon",
        "usr/bin/pyxonctl",
        "usr/share/applications/" + kAppID + ".desktop",
        "usr/share/icons/hicolor/scalable/apps/" + kAppID + ".svg",
        "usr/share/doc/pyxon/examples/udev/70-pyxon-diag-mm-ignore.rules",
        "usr/share/man/man1/pyxon.1.gz",
        "usr/share/man/man1/pyxonctl.1.gz",
        "usr/share/metainfo/" + kAppID + ".metainfo.xml",
        "usr/share/pyxon/oru_test_lte.deviceconfig",
    };
    EXPECT_EQ(files, expected);

    // The packaged program runs.
    const ProgramRun version =
        ProgramRun::of({(scratch / "usr/bin/pyxonctl").string(), "--version"});
    EXPECT_EQ(version.out, std::string("pyxonctl ") + PYXON_VERSION + "\n");
    fs::remove_all(scratch);
}

TEST_F(DebianPackage, NamesItsDependenciesAndRecommendsModemManager) {
    const ProgramRun info = ProgramRun::of({PYXON_DPKG_DEB, "-I", kPackage.string()});
    ASSERT_EQ(info.exitCode, 0) << info.err;
    const auto field = [&info](const std::string& name) {
        const std::string key = "\n " + name + ": ";
        const auto at = info.out.find(key);
        if (at == std::string::npos) return std::string();
        const auto start = at + key.size();
        return info.out.substr(start, info.out.find('\n', start) - start);
    };
    EXPECT_EQ(field("Package"), "pyxon");
    EXPECT_EQ(field("Version"), PYXON_VERSION);
    EXPECT_EQ(field("Recommends"), "modemmanager");
    const std::string depends = ", " + field("Depends") + ",";
    // Found in the binaries by dpkg-shlibdeps...
    for (const char* library : {"libc6", "libstdc++6", "libqt6core6", "libqt6quick6"})
        EXPECT_NE(depends.find(std::string(", ") + library + " "), std::string::npos)
            << library << " missing from: " << depends;
    // ... and what the window loads at run time.
    for (const char* module :
         {"qml6-module-qtquick", "qml6-module-qtquick-controls", "qml6-module-qtquick-layouts",
          "qml6-module-qtquick-window", "qml6-module-qtquick-templates",
          "qml6-module-qtqml-workerscript", "qml6-module-qtcharts", "qt6-qpa-plugins"})
        EXPECT_NE(depends.find(std::string(", ") + module + ","), std::string::npos)
            << module << " missing from: " << depends;
}

}  // namespace
