// The DIAG port found among the USB interfaces of a sysfs tree the test writes.
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <string>

#include "sources/diag/port/PortFinder.h"

namespace pyx::diag {
namespace {

namespace fs = std::filesystem;

class FakeSysfs {
  public:
    FakeSysfs() {
        root_ = fs::temp_directory_path() /
                ("pyxon-sysfs-" + std::to_string(::getpid()) + "-" + std::to_string(++count_));
        fs::remove_all(root_);
        fs::create_directories(devices());
    }
    ~FakeSysfs() { fs::remove_all(root_); }
    FakeSysfs(const FakeSysfs&) = delete;
    FakeSysfs& operator=(const FakeSysfs&) = delete;

    [[nodiscard]] std::string root() const { return root_.string(); }
    [[nodiscard]] fs::path devices() const { return root_ / "bus" / "usb" / "devices"; }

    void device(const std::string& name, const std::string& vendor, const std::string& product) {
        fs::create_directories(devices() / name);
        write(devices() / name / "idVendor", vendor);
        write(devices() / name / "idProduct", product);
    }
    // An interface as sysfs writes it (hex values with a newline), with its tty (if any)
    // directly under it or under tty/.
    void interface(const std::string& name, const std::string& cls, const std::string& sub,
                   const std::string& protocol, const std::string& endpoints,
                   const std::string& tty, bool underTtyFolder = false) {
        const fs::path dir = devices() / name;
        fs::create_directories(dir);
        write(dir / "bInterfaceClass", cls);
        write(dir / "bInterfaceSubClass", sub);
        write(dir / "bInterfaceProtocol", protocol);
        write(dir / "bNumEndpoints", endpoints);
        if (!tty.empty()) fs::create_directories(underTtyFolder ? dir / "tty" / tty : dir / tty);
    }

  private:
    static void write(const fs::path& file, const std::string& text) {
        std::ofstream(file) << text << "\n";
    }

    fs::path root_;
    static inline int count_ = 0;
};

// A Quectel EC25 in the older layout: every vendor interface ff/ff/ff, the QMI one with three
// endpoints; the DIAG one is interface 0.
void quectelEc25(FakeSysfs& sysfs) {
    sysfs.device("1-1", "2c7c", "0125");
    sysfs.interface("1-1:1.0", "ff", "ff", "ff", "02", "ttyUSB0");
    sysfs.interface("1-1:1.1", "ff", "00", "00", "03", "ttyUSB1");
    sysfs.interface("1-1:1.2", "ff", "00", "00", "03", "ttyUSB2");
    sysfs.interface("1-1:1.3", "ff", "00", "00", "03", "ttyUSB3");
    sysfs.interface("1-1:1.4", "ff", "ff", "ff", "03", "");
}

TEST(PortFinder, TakesTheVendorInterfaceWithTwoEndpoints) {
    FakeSysfs sysfs;
    quectelEc25(sysfs);
    const PortSearch search = PortFinder(sysfs.root()).find();
    ASSERT_TRUE(search.device);
    EXPECT_EQ(*search.device, "/dev/ttyUSB0");
    EXPECT_EQ(search.seen.size(), 4U);  // the QMI interface has no serial port
}

TEST(PortFinder, PrefersProtocol30OverProtocolFf) {
    FakeSysfs sysfs;
    // An RM500Q-like layout, listed so that the ff/ff/ff interface comes first.
    sysfs.device("2-1", "2c7c", "0800");
    sysfs.interface("2-1:1.0", "ff", "ff", "ff", "02", "ttyUSB4");
    sysfs.interface("2-1:1.3", "ff", "ff", "30", "02", "ttyUSB7", true);
    sysfs.interface("2-1:1.4", "ff", "00", "00", "03", "ttyUSB8");
    const PortSearch search = PortFinder(sysfs.root(), "/devroot").find();
    ASSERT_TRUE(search.device);
    EXPECT_EQ(*search.device, "/devroot/ttyUSB7");
}

TEST(PortFinder, FindsTheTtyUnderItsTtyFolder) {
    FakeSysfs sysfs;
    sysfs.interface("3-2:1.0", "ff", "ff", "ff", "02", "ttyUSB2", true);
    const PortSearch search = PortFinder(sysfs.root()).find();
    ASSERT_TRUE(search.device);
    EXPECT_EQ(*search.device, "/dev/ttyUSB2");
}

TEST(PortFinder, TakesAPcieModulesDiagChannelWithoutAUsbOne) {
    FakeSysfs sysfs;
    sysfs.interface("1-1:1.2", "ff", "00", "00", "02", "ttyUSB1");
    for (const char* port : {"wwan0at0", "wwan0qcdm0", "wwan0mbim0"})
        fs::create_directories(fs::path(sysfs.root()) / "class" / "wwan" / port);
    const PortSearch search = PortFinder(sysfs.root()).find();
    ASSERT_TRUE(search.device);
    EXPECT_EQ(*search.device, "/dev/wwan0qcdm0");
    // A USB DIAG interface comes first.
    sysfs.interface("1-1:1.0", "ff", "ff", "ff", "02", "ttyUSB0");
    EXPECT_EQ(PortFinder(sysfs.root()).find().device, "/dev/ttyUSB0");
}

TEST(PortFinder, NoneFoundListsTheSerialInterfacesSeen) {
    FakeSysfs sysfs;
    sysfs.device("1-1", "1199", "9071");
    sysfs.interface("1-1:1.2", "ff", "00", "00", "02", "ttyUSB1");
    sysfs.interface("1-1:1.3", "ff", "ff", "ff", "03", "ttyUSB2");  // three endpoints: not DIAG
    sysfs.interface("1-1:1.8", "ff", "ff", "ff", "03", "");         // no serial port
    sysfs.device("1-2", "046d", "c52b");  // a USB device without interfaces of its own here
    const PortSearch search = PortFinder(sysfs.root()).find();
    EXPECT_FALSE(search.device);
    EXPECT_EQ(search.notFoundLine(),
              "no DIAG port found (USB serial interfaces seen: "
              "1-1:1.2 (1199:9071) ff/00/00, 2 endpoints, ttyUSB1; "
              "1-1:1.3 (1199:9071) ff/ff/ff, 3 endpoints, ttyUSB2)");
}

TEST(PortFinder, NoneFoundWithoutAnySerialInterface) {
    FakeSysfs sysfs;
    EXPECT_EQ(PortFinder(sysfs.root()).find().notFoundLine(),
              "no DIAG port found (no USB serial interfaces seen)");
    EXPECT_EQ(PortFinder(sysfs.root() + "/missing").find().notFoundLine(),
              "no DIAG port found (no USB serial interfaces seen)");
}

}  // namespace
}  // namespace pyx::diag
