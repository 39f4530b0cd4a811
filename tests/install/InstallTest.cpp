// Pyxon installed with `cmake --install` into a prefix of its own, used from there as a user
// would: the programs find the installed resource bundle, and the desktop entry, AppStream
// metadata and manual pages are what the desktop and man expect.
#include <gtest/gtest.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <sstream>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "tests/support/ChildProcess.h"
#include "tests/support/ProgramRun.h"

namespace {

namespace fs = std::filesystem;
using pyx::test::ChildProcess;
using pyx::test::ProgramRun;
using namespace std::chrono_literals;

const std::string kAppID = PYXON_APP_ID;

// An empty folder of this process's own under the test's temporary folder.
fs::path scratchFolder(const std::string& name) {
    const fs::path path =
        fs::path(::testing::TempDir()) / (name + "_" + std::to_string(::getpid()));
    fs::remove_all(path);
    fs::create_directories(path);
    return path;
}

ProgramRun installInto(const fs::path& prefix) {
    return ProgramRun::of({PYXON_CMAKE, "--install", PYXON_BUILD_DIR, "--prefix", prefix.string()});
}

std::string readFile(const fs::path& path) {
    std::ifstream in(path);
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

// Whether every one of lines is a whole line of text.
bool hasLines(const std::string& text, const std::vector<std::string>& lines) {
    for (const auto& wanted : lines) {
        std::istringstream in(text);
        bool found = false;
        for (std::string line; !found && std::getline(in, line);) found = line == wanted;
        if (!found) return false;
    }
    return true;
}

// Waits, bounded by limit, until every one of lines is a whole line of the file out, which
// program writes; true if they all came. Stops waiting when program has ended. Not a timing
// assertion: a slow machine only takes longer.
bool waitForLines(ChildProcess& program, const fs::path& out, const std::vector<std::string>& lines,
                  std::chrono::seconds limit) {
    const auto deadline = std::chrono::steady_clock::now() + limit;
    while (true) {
        const bool ended = !program.running();
        if (hasLines(readFile(out), lines)) return true;
        if (ended || std::chrono::steady_clock::now() > deadline) return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(100));
    }
}

// The subcommands that a program's --help lists under "Subcommands:".
std::vector<std::string> subcommandsIn(const std::string& help) {
    std::vector<std::string> names;
    std::istringstream in(help);
    bool inList = false;
    for (std::string line; std::getline(in, line);) {
        if (line.rfind("Subcommands:", 0) == 0) {
            inList = true;
        } else if (inList && line.rfind("  ", 0) == 0) {
            std::istringstream words(line);
            std::string name;
            words >> name;
            names.push_back(name);
        } else {
            inList = false;
        }
    }
    return names;
}

class Installed : public ::testing::Test {
  protected:
    static void SetUpTestSuite() {
        root_ = scratchFolder("pyxon_installed");
        prefix_ = root_ / "prefix";
        install_ = installInto(prefix_);
    }
    static void TearDownTestSuite() {
        std::error_code ec;
        fs::remove_all(root_, ec);
    }
    void SetUp() override {
        ASSERT_EQ(install_.exitCode, 0) << "cmake --install failed:\n" << install_.err;
    }

    static fs::path program(const std::string& name) { return prefix_ / "bin" / name; }

    // Starts args in the background, in root_, its stdout and stderr written to files there.
    static ChildProcess startInRoot(std::vector<std::string> args) {
        return ChildProcess(ChildProcess::Options{.argv = std::move(args),
                                                  .stderrFile = (root_ / "stderr.txt").string(),
                                                  .stdoutFile = stdoutFile().string(),
                                                  .workDir = root_.string()});
    }
    static fs::path stdoutFile() { return root_ / "stdout.txt"; }
    static std::string outputs() {
        return readFile(stdoutFile()) + "\nstderr:\n" + readFile(root_ / "stderr.txt");
    }

    static inline fs::path root_;
    static inline fs::path prefix_;
    static inline ProgramRun install_;
};

TEST_F(Installed, PyxonHeadlessFindsTheInstalledBundleAndEndsWithStatusZeroOnSigterm) {
    // Started outside the source tree, so that only the installed bundle can be found.
    ChildProcess pyxon = startInRoot({program("pyxon").string(), "--headless", "--speed", "20"});
    ASSERT_GT(pyxon.pid(), 0);
    EXPECT_TRUE(waitForLines(pyxon, stdoutFile(),
                             {"pushing metric file", "Querying SIM files", "Received Valid Metric"},
                             60s))
        << outputs();
    EXPECT_EQ(pyxon.terminate(), 0);
}

TEST_F(Installed, PyxonLooksForItsMetricFileUnderItsOwnPrefix) {
    // A second installation whose bundle lacks the metric file: the program says so rather than
    // reading one from anywhere else.
    const fs::path bare = root_ / "bare";
    ASSERT_EQ(installInto(bare).exitCode, 0);
    ASSERT_TRUE(fs::remove(bare / "share/pyxon/oru_test_lte.deviceconfig"));
    ChildProcess pyxon = startInRoot({(bare / "bin/pyxon").string(), "--headless"});
    ASSERT_GT(pyxon.pid(), 0);
    EXPECT_TRUE(waitForLines(pyxon, stdoutFile(), {"Metric Log File path doesnt exist"}, 60s))
        << outputs();
    EXPECT_EQ(readFile(stdoutFile()).find("pushing metric file"), std::string::npos);
    EXPECT_EQ(pyxon.terminate(), 0);
}

TEST_F(Installed, PyxonctlDecodesARecord) {
    const ProgramRun run =
        ProgramRun::of({program("pyxonctl").string(), "decode"},
                       R"({"kKeyMetricID": 3986178, "kKeyPayload": "08fbb0def7d32b12040814101e"})"
                       "\n");
    EXPECT_EQ(run.exitCode, 0) << run.err;
    EXPECT_EQ(run.out, R"({"metric":"0x3CD302","property":"myLTETxPowerDict","dict":{"timestamp":)"
                       R"("2017-07-14 02:40:00 GMT","tx_power_info":[{"pucch_tx_power":10,)"
                       R"("pusch_tx_power":15}]}})"
                       "\n");
}

TEST_F(Installed, BothProgramsShowTheProjectVersion) {
    for (const std::string name : {"pyxon", "pyxonctl"}) {
        const ProgramRun run = ProgramRun::of({program(name).string(), "--version"});
        EXPECT_EQ(run.exitCode, 0) << name;
        EXPECT_EQ(run.out, name + " " + PYXON_VERSION + "\n");
    }
}

TEST_F(Installed, DesktopEntryPassesDesktopFileValidateAndShowsTheIcon) {
    const fs::path entry = prefix_ / "share/applications" / (kAppID + ".desktop");
    ASSERT_TRUE(fs::is_regular_file(entry)) << entry;
    const std::string text = readFile(entry);
    EXPECT_NE(text.find("\nExec=pyxon\n"), std::string::npos) << text;
    EXPECT_NE(text.find("\nCategories=Network;Utility;\n"), std::string::npos) << text;
    EXPECT_NE(text.find("\nIcon=" + kAppID + "\n"), std::string::npos) << text;
    const fs::path icon = prefix_ / "share/icons/hicolor/scalable/apps" / (kAppID + ".svg");
    ASSERT_TRUE(fs::is_regular_file(icon)) << icon;
    EXPECT_NE(readFile(icon).find("<svg"), std::string::npos);

    if (std::string(PYXON_DESKTOP_FILE_VALIDATE).empty())
        GTEST_SKIP() << "desktop-file-validate not found (Debian package desktop-file-utils)";
    const ProgramRun run = ProgramRun::of({PYXON_DESKTOP_FILE_VALIDATE, entry.string()});
    EXPECT_EQ(run.exitCode, 0) << run.out << run.err;
    EXPECT_EQ(run.out.find("error:"), std::string::npos) << run.out;
}

TEST_F(Installed, AppStreamMetadataPassesAppstreamcliValidate) {
    const fs::path metainfo = prefix_ / "share/metainfo" / (kAppID + ".metainfo.xml");
    ASSERT_TRUE(fs::is_regular_file(metainfo)) << metainfo;
    EXPECT_NE(readFile(metainfo).find("<launchable type=\"desktop-id\">" + kAppID + ".desktop<"),
              std::string::npos);
    if (std::string(PYXON_APPSTREAMCLI).empty())
        GTEST_SKIP() << "appstreamcli not found (Debian package appstream)";
    const ProgramRun run =
        ProgramRun::of({PYXON_APPSTREAMCLI, "validate", "--no-net", metainfo.string()});
    EXPECT_EQ(run.exitCode, 0) << run.out << run.err;
}

TEST_F(Installed, ManualPagesDescribeBothProgramsAndEverySubcommand) {
#ifndef PYXON_HAVE_MAN_PAGES
    GTEST_SKIP() << "built without help2man: no manual pages";
#endif
    const fs::path pages = prefix_ / "share/man/man1";
    const ProgramRun pyxon = ProgramRun::of({"gzip", "-dc", (pages / "pyxon.1.gz").string()});
    ASSERT_EQ(pyxon.exitCode, 0) << pyxon.err;
    EXPECT_NE(pyxon.out.find(".TH PYXON \"1\""), std::string::npos);
    EXPECT_NE(pyxon.out.find("\\-\\-headless"), std::string::npos);
    EXPECT_NE(pyxon.out.find(std::string("pyxon ") + PYXON_VERSION), std::string::npos);

    const ProgramRun pyxonctl = ProgramRun::of({"gzip", "-dc", (pages / "pyxonctl.1.gz").string()});
    ASSERT_EQ(pyxonctl.exitCode, 0) << pyxonctl.err;
    EXPECT_NE(pyxonctl.out.find(".TH PYXONCTL \"1\""), std::string::npos);
    const auto subcommands =
        subcommandsIn(ProgramRun::of({program("pyxonctl").string(), "--help"}).out);
    ASSERT_FALSE(subcommands.empty());
    for (const auto& name : subcommands)
        EXPECT_NE(pyxonctl.out.find(".SS \"pyxonctl " + name + "\""), std::string::npos) << name;
}

}  // namespace
