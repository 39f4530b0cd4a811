#include "sources/diag/port/PortFinder.h"

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <system_error>

namespace pyx::diag {

namespace {

namespace fs = std::filesystem;

std::string firstLine(const fs::path& file) {
    std::ifstream in(file);
    std::string line;
    std::getline(in, line);
    while (!line.empty() && (line.back() == ' ' || line.back() == '\r')) line.pop_back();
    return line;
}

// A sysfs attribute written in hex ("ff", "02"); -1 when absent or not a number.
int hexAttribute(const fs::path& file) {
    const std::string text = firstLine(file);
    if (text.empty()) return -1;
    std::size_t used = 0;
    try {
        const int value = std::stoi(text, &used, 16);
        return used == text.size() ? value : -1;
    } catch (const std::exception&) {
        return -1;
    }
}

bool isTtyUsb(const std::string& name) {
    return name.starts_with("ttyUSB") && name.size() > 6;
}

// The ttyUSB port under an interface: a direct child, or one under its tty/ folder.
std::string ttyOf(const fs::path& interface) {
    std::error_code error;
    for (const fs::path& folder : {interface, interface / "tty"}) {
        std::vector<std::string> names;
        for (const auto& entry : fs::directory_iterator(folder, error))
            if (isTtyUsb(entry.path().filename().string()))
                names.push_back(entry.path().filename().string());
        if (!names.empty()) return *std::min_element(names.begin(), names.end());
    }
    return {};
}

std::string usbIdOf(const fs::path& devices, const std::string& interfaceName) {
    const fs::path device = devices / interfaceName.substr(0, interfaceName.find(':'));
    const std::string vendor = firstLine(device / "idVendor");
    const std::string product = firstLine(device / "idProduct");
    if (vendor.empty() || product.empty()) return {};
    return vendor + ":" + product;
}

std::string hexByte(int value) {
    if (value < 0) return "?";
    static constexpr char kDigits[] = "0123456789abcdef";
    return {kDigits[(value >> 4) & 0xF], kDigits[value & 0xF]};
}

}  // namespace

std::string UsbSerialInterface::describe() const {
    std::string line = name;
    if (!usbId.empty()) line += " (" + usbId + ")";
    line += " " + hexByte(interfaceClass) + "/" + hexByte(subClass) + "/" + hexByte(protocol);
    if (endpoints >= 0) line += ", " + std::to_string(endpoints) + " endpoints";
    return line + ", " + tty;
}

std::string PortSearch::notFoundLine() const {
    std::string line = "no DIAG port found (";
    if (seen.empty()) return line + "no USB serial interfaces seen)";
    line += "USB serial interfaces seen: ";
    for (std::size_t i = 0; i < seen.size(); ++i) {
        if (i > 0) line += "; ";
        line += seen[i].describe();
    }
    return line + ")";
}

PortSearch PortFinder::find() const {
    PortSearch search;
    const fs::path devices = fs::path(sysfsRoot_) / "bus" / "usb" / "devices";
    std::error_code error;
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(devices, error)) {
        const std::string name = entry.path().filename().string();
        // Interfaces are "<device>:<configuration>.<interface>"; devices and hubs are not.
        const auto colon = name.find(':');
        if (colon != std::string::npos && name.find('.', colon) != std::string::npos)
            names.push_back(name);
    }
    std::sort(names.begin(), names.end());

    for (const std::string& name : names) {
        const fs::path interface = devices / name;
        UsbSerialInterface seen{
            .name = name,
            .usbId = usbIdOf(devices, name),
            .interfaceClass = hexAttribute(interface / "bInterfaceClass"),
            .subClass = hexAttribute(interface / "bInterfaceSubClass"),
            .protocol = hexAttribute(interface / "bInterfaceProtocol"),
            .endpoints = hexAttribute(interface / "bNumEndpoints"),
            .tty = ttyOf(interface),
        };
        if (!seen.tty.empty()) search.seen.push_back(std::move(seen));
    }

    // The first interface of the preferred signature, then of the other.
    for (const int protocol : {0x30, 0xFF}) {
        const auto fits = [protocol](const UsbSerialInterface& i) {
            return i.interfaceClass == 0xFF && i.subClass == 0xFF && i.protocol == protocol &&
                   i.endpoints == 2;
        };
        const auto it = std::find_if(search.seen.begin(), search.seen.end(), fits);
        if (it != search.seen.end()) {
            search.device = (fs::path(devRoot_) / it->tty).string();
            break;
        }
    }
    if (search.device) return search;

    // A PCIe (MHI) module's DIAG channel: a WWAN port of type QCDM, no tty.
    std::vector<std::string> wwan;
    for (const auto& entry : fs::directory_iterator(fs::path(sysfsRoot_) / "class" / "wwan", error))
        if (entry.path().filename().string().find("qcdm") != std::string::npos)
            wwan.push_back(entry.path().filename().string());
    if (!wwan.empty())
        search.device = (fs::path(devRoot_) / *std::min_element(wwan.begin(), wwan.end())).string();
    return search;
}

}  // namespace pyx::diag
