// Opening, reading and writing a DIAG port, and the port's errors as the user reads them.
#include <gtest/gtest.h>

#include <grp.h>
#include <unistd.h>

#include <chrono>
#include <cstdio>
#include <fstream>
#include <string>

#include "sources/diag/frame/Hdlc.h"
#include "sources/diag/port/DiagPort.h"
#include "tests/sources/diag/support/FakeDiagModem.h"

namespace pyx::diag {
namespace {

using namespace std::chrono_literals;
using test::FakeDiagModem;

TEST(DiagPort, ATtyIsOpenedRawAndAnswers) {
    FakeDiagModem modem;
    DiagPort port(modem.path());
    EXPECT_TRUE(port.isTty());
    port.write(frame(Bytes{0x00}), 2s);
    ASSERT_TRUE(modem.waitForRequest(Bytes{0x00}));
    // The reply comes back byte for byte (no line discipline in between).
    Bytes read;
    std::vector<std::uint8_t> buffer(256);
    while (read.empty() || read.back() != 0x7E) {  // the reply's frame, whole
        const std::size_t n = port.read(buffer, 5s);
        ASSERT_GT(n, 0U) << "no reply within 5 s";
        read.insert(read.end(), buffer.begin(), buffer.begin() + static_cast<long>(n));
    }
    EXPECT_EQ(read, modem.written());
}

TEST(DiagPort, ACharacterDeviceIsNoTty) {
    DiagPort port("/dev/null");
    EXPECT_FALSE(port.isTty());
    std::vector<std::uint8_t> buffer(16);
    // A device that ends its input has gone away.
    try {
        port.read(buffer, 2s);
        FAIL() << "no error";
    } catch (const PortError& error) {
        EXPECT_EQ(error.kind(), PortError::Kind::Gone);
    }
}

TEST(DiagPort, AMissingDeviceIsNotThere) {
    try {
        DiagPort port("/dev/ttyUSB-pyxon-none");
        FAIL() << "opened";
    } catch (const PortError& error) {
        EXPECT_EQ(error.kind(), PortError::Kind::Gone);
        EXPECT_STREQ(error.what(), "DIAG port /dev/ttyUSB-pyxon-none is not there");
    }
}

TEST(DiagPort, AHangUpIsGone) {
    FakeDiagModem modem;
    DiagPort port(modem.path());
    modem.hangUp();
    std::vector<std::uint8_t> buffer(16);
    try {
        port.read(buffer, 5s);
        FAIL() << "no error";
    } catch (const PortError& error) {
        EXPECT_EQ(error.kind(), PortError::Kind::Gone);
        EXPECT_EQ(std::string(error.what()),
                  "DIAG port " + modem.path() + " went away (unplugged, or the modem restarted)");
    }
}

TEST(DiagPort, ErrorsByErrno) {
    const PortError busy = PortError::fromErrno("/dev/ttyUSB0", EBUSY, "open");
    EXPECT_EQ(busy.kind(), PortError::Kind::Busy);
    EXPECT_EQ(std::string(busy.what()),
              "DIAG port /dev/ttyUSB0 is busy: ModemManager probes it (or another DIAG tool has "
              "it open); install the udev rule 70-pyxon-diag-mm-ignore.rules "
              "(ENV{ID_MM_PORT_IGNORE}=\"1\", in Pyxon's doc examples) and restart ModemManager");
    EXPECT_EQ(PortError::fromErrno("/dev/ttyUSB0", ENODEV, "read").kind(), PortError::Kind::Gone);
    EXPECT_EQ(PortError::fromErrno("/dev/ttyUSB0", EIO, "read").kind(), PortError::Kind::Gone);
    const PortError other = PortError::fromErrno("/dev/ttyUSB0", EINVAL, "open");
    EXPECT_EQ(other.kind(), PortError::Kind::Other);
    EXPECT_STREQ(other.what(), "cannot open DIAG port /dev/ttyUSB0: Invalid argument");
    // Permission: the device's group, told by its owner.
    const group* dialout = ::getgrnam("dialout");
    if (dialout == nullptr) GTEST_SKIP() << "no group dialout to give a file to";
    const std::string file =
        ::testing::TempDir() + "pyxon-diag-denied-" + std::to_string(::getpid());
    { std::ofstream(file) << ""; }
    const bool given = ::chown(file.c_str(), ::geteuid(), dialout->gr_gid) == 0;
    if (!given) {
        std::remove(file.c_str());
        GTEST_SKIP() << "cannot give a file to the group dialout as this user";
    }
    const PortError denied = PortError::fromErrno(file, EACCES, "open");
    EXPECT_EQ(denied.kind(), PortError::Kind::Permission);
    EXPECT_EQ(std::string(denied.what()),
              "permission denied opening DIAG port " + file +
                  ": join the group dialout (sudo usermod -aG dialout $USER) and log in again");
    std::remove(file.c_str());
}

}  // namespace
}  // namespace pyx::diag
