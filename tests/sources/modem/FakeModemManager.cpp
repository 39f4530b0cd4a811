#include "FakeModemManager.h"

#include <gtest/gtest.h>
#include <stdlib.h>

#include <sdbus-c++/sdbus-c++.h>
#include <stdexcept>
#include <thread>

namespace pyx::test {

namespace {

constexpr char kService[] = "org.freedesktop.ModemManager1";
constexpr char kRoot[] = "/org/freedesktop/ModemManager1";
constexpr char kMock[] = "org.freedesktop.DBus.Mock";
constexpr auto kCallTimeout = std::chrono::seconds(10);

}  // namespace

FakeModemManager::FakeModemManager() {
    bus_ = std::make_unique<ChildProcess>(
        ChildProcess::Options{.argv = {"dbus-daemon", "--session", "--nofork", "--print-address=1"},
                              .captureStdout = true});
    const auto line = bus_->readLine(std::chrono::seconds(30));
    if (!line || line->empty()) throw std::runtime_error("dbus-daemon printed no address");
    address_ = *line;
    ::setenv("DBUS_SYSTEM_BUS_ADDRESS", address_.c_str(), 1);
    connection_ = sdbus::createSystemBusConnection();
}

FakeModemManager::~FakeModemManager() {
    connection_.reset();
    service_.reset();
    bus_.reset();
}

bool FakeModemManager::serviceOwned() {
    auto dbus = sdbus::createProxy(*connection_, "org.freedesktop.DBus", "/org/freedesktop/DBus");
    bool owned = false;
    dbus->callMethod("NameHasOwner")
        .onInterface("org.freedesktop.DBus")
        .withTimeout(kCallTimeout)
        .withArguments(std::string(kService))
        .storeResultsTo(owned);
    return owned;
}

void FakeModemManager::start(const std::string& parameters) {
    service_ = std::make_unique<ChildProcess>(
        ChildProcess::Options{.argv = {"/usr/bin/python3", "-m", "dbusmock", "--system", "-t",
                                       PYXON_FAKE_MODEMMANAGER, "-p", parameters},
                              .env = {{"DBUS_SYSTEM_BUS_ADDRESS", address_}}});
    const auto until = std::chrono::steady_clock::now() + std::chrono::seconds(60);
    while (!serviceOwned()) {
        if (!service_->running()) throw std::runtime_error("the fake ModemManager did not start");
        if (std::chrono::steady_clock::now() > until)
            throw std::runtime_error("the fake ModemManager did not take its name in 60 s");
        std::this_thread::sleep_for(std::chrono::milliseconds(50));
    }
}

void FakeModemManager::stop() {
    service_.reset();
    const auto until = std::chrono::steady_clock::now() + std::chrono::seconds(30);
    while (serviceOwned() && std::chrono::steady_clock::now() < until)
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
}

void FakeModemManager::addModem(const std::string& scenario, std::uint32_t index) {
    std::string path;
    sdbus::createProxy(*connection_, kService, kRoot)
        ->callMethod("AddModem")
        .onInterface(kMock)
        .withTimeout(kCallTimeout)
        .withArguments(scenario, index)
        .storeResultsTo(path);
}

void FakeModemManager::removeModem(std::uint32_t index) {
    sdbus::createProxy(*connection_, kService, kRoot)
        ->callMethod("RemoveModem")
        .onInterface(kMock)
        .withTimeout(kCallTimeout)
        .withArguments(index);
}

void FakeModemManager::stall(std::chrono::milliseconds duration) {
    sdbus::createProxy(*connection_, kService, kRoot)
        ->callMethod("Stall")
        .onInterface(kMock)
        .withTimeout(kCallTimeout)
        .withArguments(static_cast<double>(duration.count()) / 1000.0);
}

std::uint32_t FakeModemManager::signalRate(std::uint32_t index) {
    sdbus::Variant rate;
    sdbus::createProxy(*connection_, kService,
                       std::string(kRoot) + "/Modem/" + std::to_string(index))
        ->callMethod("Get")
        .onInterface("org.freedesktop.DBus.Properties")
        .withTimeout(kCallTimeout)
        .withArguments(std::string("org.freedesktop.ModemManager1.Modem.Signal"),
                       std::string("Rate"))
        .storeResultsTo(rate);
    return rate.get<std::uint32_t>();
}

void FakeModemManager::setLteRsrp(double rsrp) {
    sdbus::createProxy(*connection_, kService, kRoot)
        ->callMethod("SetLteRsrp")
        .onInterface(kMock)
        .withTimeout(kCallTimeout)
        .withArguments(rsrp);
}

}  // namespace pyx::test
