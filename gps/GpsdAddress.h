// Where gpsd listens: --gps alone is gpsd's own default, --gps HOST:PORT another.
#pragma once

#include <stdexcept>
#include <string>
#include <string_view>

namespace pyx::gps {

struct GpsdAddress {
    std::string host = "127.0.0.1";
    std::string port = "2947";

    [[nodiscard]] std::string text() const { return host + ":" + port; }
};

// A --gps value that is not HOST:PORT (or HOST, or :PORT); what() is one line.
class GpsdAddressError : public std::invalid_argument {
  public:
    using std::invalid_argument::invalid_argument;
};

// "" (gpsd's default), "HOST", "HOST:PORT", ":PORT", "[IPv6]:PORT". Throws GpsdAddressError.
[[nodiscard]] GpsdAddress parseGpsdAddress(std::string_view text);

}  // namespace pyx::gps
