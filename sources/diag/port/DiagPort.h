// An open DIAG port: a USB serial tty (/dev/ttyUSB0, set raw) or a character device that is no
// tty (/dev/wwan0qcdm0, read and written as it is). Every wait has a timeout and wakes on a
// stop request; the port going away is a PortError of kind Gone.
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string>

#include "sources/diag/port/PortError.h"
#include "sources/diag/port/UniqueFd.h"

namespace pyx::diag {

class DiagPort {
  public:
    // Opens path (throws PortError). A tty is set raw (8N1, no flow control, no echo) and
    // taken exclusively, so that a prober that comes later finds it busy.
    explicit DiagPort(std::string path);

    [[nodiscard]] const std::string& path() const { return path_; }
    [[nodiscard]] bool isTty() const { return tty_; }

    // Waits up to timeout for bytes, or until wakeFd (if not -1) is readable; what arrived
    // (0 bytes: the timeout, or the wake). Throws PortError when the port goes away.
    std::size_t read(std::span<std::uint8_t> into, std::chrono::milliseconds timeout,
                     int wakeFd = -1);
    // Writes all of bytes within timeout; throws PortError (gone, or a write that never ends).
    void write(std::span<const std::uint8_t> bytes, std::chrono::milliseconds timeout);

  private:
    std::string path_;
    UniqueFd fd_;
    bool tty_ = false;
};

}  // namespace pyx::diag
