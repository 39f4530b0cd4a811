// Why a DIAG port could not be opened, read or written, as one line a user can act on.
#pragma once

#include <cstdint>
#include <stdexcept>
#include <string>
#include <string_view>
#include <utility>

namespace pyx::diag {

// The udev rule shipped in the package's examples that keeps ModemManager off a DIAG port.
inline constexpr std::string_view kModemManagerIgnoreRule = "70-pyxon-diag-mm-ignore.rules";

class PortError : public std::runtime_error {
  public:
    enum class Kind : std::uint8_t {
        Permission,  // the user may not open the device: join its group
        Busy,        // another program (ModemManager) holds it
        Gone,        // not there (any more): unplugged, modem reset, hung up
        Other,       // anything else (not a device we can use, a write that never ends)
    };

    PortError(Kind kind, std::string device, const std::string& line)
        : std::runtime_error(line), kind_(kind), device_(std::move(device)) {}

    // The error of a failed open, read or write (doing: "open", "read"...) of device by errno.
    // A denied permission names the device's group (from its owner, found with stat).
    [[nodiscard]] static PortError fromErrno(const std::string& device, int error,
                                             std::string_view doing);
    // The device hung up (a pseudo-terminal's other side closed, a USB serial port unplugged).
    [[nodiscard]] static PortError hungUp(const std::string& device);

    [[nodiscard]] Kind kind() const { return kind_; }
    [[nodiscard]] const std::string& device() const { return device_; }

  private:
    Kind kind_;
    std::string device_;
};

}  // namespace pyx::diag
