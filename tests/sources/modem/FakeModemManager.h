// A private system bus with a fake ModemManager on it, for the modem source's tests. The bus
// is a dbus-daemon of its own whose address DBUS_SYSTEM_BUS_ADDRESS names for this process;
// the fake is python3-dbusmock with the template fake_modemmanager.py. Both end with the
// object, even when a test fails.
#pragma once

#include <chrono>
#include <memory>
#include <string>

#include <sdbus-c++/IConnection.h>

#include "tests/support/ChildProcess.h"

namespace pyx::test {

class FakeModemManager {
  public:
    // Starts the bus only; start() brings the service up.
    FakeModemManager();
    ~FakeModemManager();
    FakeModemManager(const FakeModemManager&) = delete;
    FakeModemManager& operator=(const FakeModemManager&) = delete;

    [[nodiscard]] const std::string& busAddress() const { return address_; }

    // Starts the fake with the template's JSON parameters and waits until it owns its name.
    void start(const std::string& parameters = "{}");
    // Ends the fake (its name leaves the bus).
    void stop();

    // The template's mock methods.
    void addModem(const std::string& scenario, std::uint32_t index);
    void removeModem(std::uint32_t index);
    void setLteRsrp(double rsrp);
    // The service answers nothing for that long, from just after the call.
    void stall(std::chrono::milliseconds duration);
    // The Signal Rate property of modem index.
    [[nodiscard]] std::uint32_t signalRate(std::uint32_t index);

  private:
    bool serviceOwned();

    std::string address_;
    std::unique_ptr<ChildProcess> bus_;
    std::unique_ptr<ChildProcess> service_;
    std::unique_ptr<sdbus::IConnection> connection_;
};

}  // namespace pyx::test
