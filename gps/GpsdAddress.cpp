#include "gps/GpsdAddress.h"

#include <algorithm>
#include <cctype>

namespace pyx::gps {

GpsdAddress parseGpsdAddress(std::string_view text) {
    GpsdAddress address;
    if (text.empty()) return address;
    std::string_view host = text;
    std::string_view port;
    if (text.front() == '[') {
        const auto close = text.find(']');
        if (close == std::string_view::npos)
            throw GpsdAddressError("--gps " + std::string(text) + ": no closing ] in the address");
        host = text.substr(1, close - 1);
        const std::string_view rest = text.substr(close + 1);
        if (!rest.empty()) {
            if (rest.front() != ':')
                throw GpsdAddressError("--gps " + std::string(text) +
                                       ": expected HOST:PORT, e.g. 127.0.0.1:2947");
            port = rest.substr(1);
        }
    } else if (const auto colon = text.rfind(':'); colon != std::string_view::npos) {
        host = text.substr(0, colon);
        port = text.substr(colon + 1);
        if (host.find(':') != std::string_view::npos)
            throw GpsdAddressError("--gps " + std::string(text) +
                                   ": write an IPv6 address in brackets, e.g. [::1]:2947");
    }
    if (!host.empty()) address.host = std::string(host);
    if (!port.empty() || text.back() == ':') {
        const bool digits =
            !port.empty() && port.size() <= 5 &&
            std::all_of(port.begin(), port.end(), [](char c) { return std::isdigit(c) != 0; });
        if (!digits || std::stoul(std::string(port)) == 0 || std::stoul(std::string(port)) > 65535)
            throw GpsdAddressError("--gps " + std::string(text) +
                                   ": the port is not a number from 1 to 65535");
        address.port = std::string(port);
    }
    return address;
}

}  // namespace pyx::gps
