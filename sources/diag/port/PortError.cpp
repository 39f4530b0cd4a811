#include "sources/diag/port/PortError.h"

#include <grp.h>
#include <sys/stat.h>

#include <cerrno>
#include <cstring>
#include <vector>

namespace pyx::diag {

namespace {

// The name of the group that owns path, or empty when it cannot be told.
std::string owningGroup(const std::string& path) {
    struct stat st {};
    if (::stat(path.c_str(), &st) != 0) return {};
    group entry{};
    group* found = nullptr;
    std::vector<char> buffer(4096);
    while (::getgrgid_r(st.st_gid, &entry, buffer.data(), buffer.size(), &found) == ERANGE)
        buffer.resize(buffer.size() * 2);
    if (found == nullptr) return "gid " + std::to_string(st.st_gid);
    return found->gr_name;
}

}  // namespace

PortError PortError::fromErrno(const std::string& device, int error, std::string_view doing) {
    switch (error) {
        case EACCES:
        case EPERM: {
            const std::string group = owningGroup(device);
            if (group.empty() || group == "root")
                return {Kind::Permission, device,
                        "permission denied opening DIAG port " + device +
                            ": run Pyxon as a user allowed to open it"};
            return {Kind::Permission, device,
                    "permission denied opening DIAG port " + device + ": join the group " + group +
                        " (sudo usermod -aG " + group + " $USER) and log in again"};
        }
        case EBUSY:
            return {Kind::Busy, device,
                    "DIAG port " + device +
                        " is busy: ModemManager probes it (or another DIAG tool has it open); "
                        "install the udev rule " +
                        std::string(kModemManagerIgnoreRule) +
                        " (ENV{ID_MM_PORT_IGNORE}=\"1\", in Pyxon's doc examples) and restart "
                        "ModemManager"};
        case ENOENT:
        case ENODEV:
        case ENXIO:
            return {Kind::Gone, device, "DIAG port " + device + " is not there"};
        case EIO:
        case EPIPE:
        case ESHUTDOWN:
            return hungUp(device);
        default:
            return {Kind::Other, device,
                    "cannot " + std::string(doing) + " DIAG port " + device + ": " +
                        std::strerror(error)};
    }
}

PortError PortError::hungUp(const std::string& device) {
    return {Kind::Gone, device,
            "DIAG port " + device + " went away (unplugged, or the modem restarted)"};
}

}  // namespace pyx::diag
