// Finds a modem's DIAG port among the USB interfaces the kernel lists under
// <sysfsRoot>/bus/usb/devices/: a vendor-specific interface (class ff, subclass ff) with two
// endpoints and protocol 30 (the newer modules' DIAG signature), or else protocol ff, whose
// USB serial driver made it a ttyUSB port. Without one, a PCIe module's DIAG channel
// (<sysfsRoot>/class/wwan/wwan0qcdm0, opened as /dev/wwan0qcdm0) is taken.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace pyx::diag {

// A USB interface with a ttyUSB port under it, as sysfs tells it.
struct UsbSerialInterface {
    std::string name;   // "1-1.4:1.0"
    std::string usbId;  // the device's "2c7c:0800", empty when sysfs does not say
    int interfaceClass = -1;
    int subClass = -1;
    int protocol = -1;
    int endpoints = -1;
    std::string tty;  // "ttyUSB0"
    // "1-1.4:1.0 (2c7c:0800) ff/ff/30, 2 endpoints, ttyUSB0"
    [[nodiscard]] std::string describe() const;
};

struct PortSearch {
    std::optional<std::string> device;     // "/dev/ttyUSB0" when one fits
    std::vector<UsbSerialInterface> seen;  // every USB serial interface, in sysfs order
    // The fault line when none fits: "no DIAG port found (USB serial interfaces seen: ...)".
    [[nodiscard]] std::string notFoundLine() const;
};

class PortFinder {
  public:
    explicit PortFinder(std::string sysfsRoot = "/sys", std::string devRoot = "/dev")
        : sysfsRoot_(std::move(sysfsRoot)), devRoot_(std::move(devRoot)) {}

    [[nodiscard]] PortSearch find() const;

  private:
    std::string sysfsRoot_;
    std::string devRoot_;
};

}  // namespace pyx::diag
