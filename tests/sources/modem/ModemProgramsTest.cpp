// pyxon and pyxonctl with --source modem, as a user runs them: each exits 0 on SIGTERM in
// every state of the bus, the service and the modem, and a listen piped into a screen shows
// the modem's values.
#include <gtest/gtest.h>

#include <chrono>
#include <fstream>
#include <sstream>
#include <thread>

#include "FakeModemManager.h"

namespace pyx::test {
namespace {

std::string readFile(const std::string& path) {
    std::ifstream in(path);
    std::stringstream text;
    text << in.rdbuf();
    return text.str();
}

class ModemPrograms : public ::testing::Test {
  protected:
    FakeModemManager fake;
    std::string stderrFile =
        ::testing::TempDir() + "modem_programs_" + std::to_string(::getpid()) + ".err";

    ~ModemPrograms() override { std::remove(stderrFile.c_str()); }

    // Starts argv, waits until its stderr says part, sends SIGTERM and returns the exit code
    // (-1 when part never came).
    int exitCodeOnSigterm(const std::vector<std::string>& argv, const std::string& busAddress,
                          const std::string& part, const std::function<void()>& thenDo = {}) {
        ChildProcess program(ChildProcess::Options{.argv = argv,
                                                   .env = {{"DBUS_SYSTEM_BUS_ADDRESS", busAddress}},
                                                   .stderrFile = stderrFile});
        if (!waitForStderr(part)) {
            ADD_FAILURE() << argv[0] << " never said \"" << part << "\"; it said:\n"
                          << readFile(stderrFile);
            return -1;
        }
        if (thenDo) thenDo();
        const int code = program.terminate();
        if (code != 0)
            ADD_FAILURE() << argv[0] << " ended with " << code << " on SIGTERM; it said:\n"
                          << readFile(stderrFile);
        return code;
    }

    bool waitForStderr(const std::string& part) {
        const auto until = std::chrono::steady_clock::now() + std::chrono::seconds(60);
        while (readFile(stderrFile).find(part) == std::string::npos) {
            if (std::chrono::steady_clock::now() > until) return false;
            std::this_thread::sleep_for(std::chrono::milliseconds(50));
        }
        return true;
    }

    void exitsZeroOnSigtermInEveryState(const std::vector<std::string>& argv) {
        EXPECT_EQ(exitCodeOnSigterm(argv, "unix:path=/nonexistent/pyxon-test-bus",
                                    "the system D-Bus cannot be reached"),
                  0)
            << "no system bus";
        EXPECT_EQ(exitCodeOnSigterm(argv, fake.busAddress(), "ModemManager is not running"), 0)
            << "ModemManager absent";
        fake.start(R"({"modem": false})");
        EXPECT_EQ(exitCodeOnSigterm(argv, fake.busAddress(), "knows no modem yet"), 0)
            << "no modem";
        fake.addModem("mbim", 0);
        EXPECT_EQ(exitCodeOnSigterm(argv, fake.busAddress(), "using the modem"), 0) << "a modem";
        EXPECT_EQ(exitCodeOnSigterm(argv, fake.busAddress(), "using the modem",
                                    [&] {
                                        fake.removeModem(0);
                                        ASSERT_TRUE(waitForStderr("is gone"));
                                    }),
                  0)
            << "modem removed";
        fake.addModem("mbim", 0);
        EXPECT_EQ(exitCodeOnSigterm(argv, fake.busAddress(), "using the modem",
                                    [&] {
                                        fake.stop();
                                        ASSERT_TRUE(waitForStderr("ModemManager is not running"));
                                    }),
                  0)
            << "ModemManager gone";
    }
};

TEST_F(ModemPrograms, PyxonHeadlessExitsZeroOnSigtermInEveryState) {
    exitsZeroOnSigtermInEveryState({PYXON, "--headless", "--source", "modem"});
}

TEST_F(ModemPrograms, PyxonctlListenExitsZeroOnSigtermInEveryState) {
    exitsZeroOnSigtermInEveryState({PYXONCTL, "listen", "--source", "modem"});
}

TEST_F(ModemPrograms, ListenPipedIntoScreenShowsTheModemsServingCell) {
    fake.start(R"({"scenario": "mbim"})");
    ChildProcess pipeline(ChildProcess::Options{
        .argv = {"/bin/sh", "-c",
                 "\"$PYXONCTL\" listen --source modem --count 10 | \"$PYXONCTL\" screen LTE "
                 "'Serving Cell Meas'"},
        .env = {{"PYXONCTL", PYXONCTL}, {"DBUS_SYSTEM_BUS_ADDRESS", fake.busAddress()}},
        .captureStdout = true,
        .stderrFile = stderrFile});
    const auto screen = pipeline.readLine(std::chrono::seconds(60));
    ASSERT_TRUE(screen) << readFile(stderrFile);
    EXPECT_NE(screen->find(R"({"text":"phy_cell_id","detail":"303"})"), std::string::npos)
        << *screen;
    EXPECT_NE(screen->find(R"({"text":"rsrp0","detail":"-97"})"), std::string::npos) << *screen;
    EXPECT_NE(screen->find(R"({"text":"rsrq0","detail":"-10"})"), std::string::npos) << *screen;
    EXPECT_NE(screen->find(R"({"text":"sinr0","detail":"13.5"})"), std::string::npos) << *screen;
    EXPECT_EQ(pipeline.wait(std::chrono::seconds(30)), 0);
}

}  // namespace
}  // namespace pyx::test
