// The modem source against a fake ModemManager on a private bus: each scenario checks what
// the screens show once the transport's events have gone through the store.
#include <gtest/gtest.h>

#include <thread>

#include "FakeModemManager.h"
#include "ModemHarness.h"
#include "core/Log.h"
#include "sources/modem/FaultReporter.h"

namespace pyx::test {
namespace {

constexpr std::int64_t kRsrpRsrqSinr = 0x3C4F6A;
constexpr std::int64_t kSimFiles = 0x3C0013;

TEST(FaultReporter, AFaultIsSaidOnceWithItsFirstValueAndTheMemoryIsBounded) {
    const CapturedLines log(systemLogSink());
    modem::FaultReporter faults;
    faults.once("ModemManager Signal.Lte rsrp: -500.0 is out of range -156..-31; left out");
    faults.once("ModemManager Signal.Lte rsrp: -612.5 is out of range -156..-31; left out");
    faults.once("ModemManager Signal.Lte rsrq: -500.0 is out of range -43..20; left out");
    ASSERT_EQ(log.lines().size(), 2U);
    EXPECT_EQ(log.lines()[0],
              "ModemManager Signal.Lte rsrp: -500.0 is out of range -156..-31; left out");

    for (int n = 0; n < 1000; ++n)
        faults.once("fault " + std::string(1, 'a' + n % 26) + "x" +
                    std::string(static_cast<std::size_t>(n / 26), 'y'));
    const auto lines = log.lines();
    ASSERT_EQ(lines.size(), modem::FaultReporter::kOnceLimit + 1);
    EXPECT_NE(lines.back().find("further faults not shown"), std::string::npos);
}

class ModemSource : public ::testing::Test {
  protected:
    FakeModemManager fake;  // first: its bus outlives the transport
    ModemHarness modem;

    bool showsRsrp(const std::string& rsrp) {
        return modem.waitFor(
            [&] { return modem.shown("LTE", "Serving Cell Meas", "rsrp0") == rsrp; });
    }
};

TEST_F(ModemSource, MbimModemShowsServingCellNeighboursBearerAndSim) {
    fake.start(R"({"scenario": "mbim"})");
    modem.start();
    modem.querySimFiles();
    ASSERT_TRUE(showsRsrp("-97"));
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Meas", "phy_cell_id"), "303");
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Meas", "rsrq0"), "-10");
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Meas", "sinr0"), "13.5");

    ASSERT_TRUE(modem.waitFor(
        [&] { return modem.shown("LTE", "Serving Cell Info", "dl_freq").has_value(); }));
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Info", "phy_cell_id"), "303");
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Info", "dl_freq"), "1300");
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Info", "freq_band_ind"), "3");
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Info", "tracking_area_code"), "6699");
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Info", "cell_id"), "27440068");
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Info", "sel_plmn_mcc"), "262");
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Info", "sel_plmn_mnc"), "1");
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Info", "num_mnc_digits"), "2");

    ASSERT_TRUE(
        modem.waitFor([&] { return modem.sections("LTE", "LTE Neighbor Cell Meas") == 2; }));
    EXPECT_EQ(modem.shown("LTE", "LTE Neighbor Cell Meas", "nbr_phys_cell_id", 0), "304");
    EXPECT_EQ(modem.shown("LTE", "LTE Neighbor Cell Meas", "nbr_rsrp", 0), "-103");
    EXPECT_EQ(modem.shown("LTE", "LTE Neighbor Cell Meas", "nbr_rsrq", 0), "-12.5");
    EXPECT_EQ(modem.shown("LTE", "LTE Neighbor Cell Meas", "freq_band_ind", 1), "20");
    EXPECT_EQ(modem.shown("LTE", "LTE Neighbor Cell Meas", "nbr_rsrp", 1), "-110");
    EXPECT_EQ(modem.shown("LTE", "LTE Neighbor Cell Meas", "nbr_rsrq", 1), "-15.0");

    ASSERT_TRUE(modem.waitFor([&] { return modem.sections("LTE", "Active Bearers") == 1; }));
    EXPECT_EQ(modem.shown("LTE", "Active Bearers", "apn"), "internet");
    EXPECT_EQ(modem.shown("LTE", "Active Bearers", "pdp_type"), "PDP_TYPE_IPv4v6");
    EXPECT_EQ(modem.shown("LTE", "Active Bearers", "pdp_addr"),
              "<0a400102 20010db8 00000000 00000000 00000002>");
    EXPECT_EQ(modem.shown("LTE", "Active Bearers", "primary_dns_addr"), "<0a400001>");

    ASSERT_TRUE(modem.waitFor([&] { return modem.shown("LTE", "NAS", "reg_status").has_value(); }));
    EXPECT_EQ(modem.shown("LTE", "NAS", "reg_status"), "KREG_STATUS_NORMAL_SERVICE");

    ASSERT_TRUE(modem.waitFor([&] { return modem.sections("Device Info", "SIM Files") >= 2; }));
    EXPECT_EQ(modem.shown("Device Info", "SIM Files", "ef_id", 0), "12258");
    EXPECT_EQ(modem.shown("Device Info", "SIM Files", "content", 0), "<98942000 00214365 8709>");
    EXPECT_EQ(modem.shown("Device Info", "SIM Files", "ef_id", 1), "28423");
    EXPECT_EQ(modem.shown("Device Info", "SIM Files", "content", 1), "<08292610 21436587 09>");
    EXPECT_EQ(modem.logLines("using the modem /org/freedesktop/ModemManager1/Modem/0"), 1);
}

TEST_F(ModemSource, AtModemWithoutCellInfoShowsSignalRegistrationAndLocation) {
    fake.start(R"({"scenario": "at"})");
    modem.start();
    ASSERT_TRUE(showsRsrp("-97"));
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Meas", "rsrq0"), "-11");
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Meas", "sinr0"), std::nullopt);
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Meas", "phy_cell_id"), std::nullopt);

    ASSERT_TRUE(modem.waitFor(
        [&] { return modem.shown("LTE", "Serving Cell Info", "cell_id").has_value(); }));
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Info", "cell_id"), "1234");
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Info", "tracking_area_code"), "6699");
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Info", "sel_plmn_mcc"), "262");
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Info", "phy_cell_id"), std::nullopt);
    EXPECT_EQ(modem.sections("LTE", "LTE Neighbor Cell Meas"), 0);

    // Several polls later the fallback was said once.
    const int polls = modem.metricEvents(kRsrpRsrqSinr);
    ASSERT_TRUE(modem.waitFor([&] { return modem.metricEvents(kRsrpRsrqSinr) >= polls + 3; }));
    EXPECT_EQ(modem.logLines("cannot list its cells (GetCellInfo: "
                             "org.freedesktop.ModemManager1.Error.Core.Unsupported)"),
              1);
}

TEST_F(ModemSource, ModemRemovedAndAddedAgainIsPickedUpAgain) {
    fake.start(R"({"scenario": "mbim"})");
    modem.start();
    ASSERT_TRUE(showsRsrp("-97"));

    fake.removeModem(0);
    ASSERT_TRUE(modem.waitForLog("the modem /org/freedesktop/ModemManager1/Modem/0 is gone"));
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Meas", "rsrp0"), "-97");  // last values stay

    fake.setLteRsrp(-88.0);
    fake.addModem("mbim", 0);
    ASSERT_TRUE(showsRsrp("-88"));
    EXPECT_EQ(modem.logLines("using the modem /org/freedesktop/ModemManager1/Modem/0"), 2);
    EXPECT_EQ(modem.logLines("is gone"), 1);
}

TEST_F(ModemSource, AQueryWhileTheModemIsGoneIsAnsweredWithoutItsLastValues) {
    fake.start(R"({"scenario": "mbim"})");
    modem.start();
    modem.querySimFiles();
    ASSERT_TRUE(modem.waitFor([&] { return modem.metricEvents(kSimFiles) > 0; }));

    fake.removeModem(0);
    ASSERT_TRUE(modem.waitForLog("the modem /org/freedesktop/ModemManager1/Modem/0 is gone"));
    const int triggers = modem.triggerEvents();
    const int files = modem.metricEvents(kSimFiles);
    modem.querySimFiles();
    ASSERT_TRUE(modem.waitFor([&] { return modem.triggerEvents() > triggers; }));
    std::this_thread::sleep_for(std::chrono::milliseconds(500));
    ASSERT_TRUE(modem.waitFor([] { return true; }));
    EXPECT_EQ(modem.metricEvents(kSimFiles), files);
}

TEST_F(ModemSource, ServiceStoppedAndStartedAgainMidRunIsReattached) {
    fake.start(R"({"scenario": "mbim"})");
    modem.start();
    ASSERT_TRUE(showsRsrp("-97"));

    fake.stop();
    ASSERT_TRUE(modem.waitForLog("ModemManager is not running"));
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Meas", "rsrp0"), "-97");  // last values stay

    fake.start(R"({"scenario": "mbim", "rsrp": -85})");
    ASSERT_TRUE(showsRsrp("-85"));
    EXPECT_EQ(modem.logLines("ModemManager is not running"), 1);
}

TEST_F(ModemSource, ModemNumberChoosesThatModemAndWaitsForOneNotThere) {
    fake.start(R"({"scenario": "mbim"})");
    fake.addModem("at", 3);
    ModemHarness third(3);
    third.start();
    ASSERT_TRUE(
        third.waitFor([&] { return third.shown("LTE", "Serving Cell Meas", "rsrq0") == "-11"; }));
    EXPECT_EQ(third.logLines("using the modem /org/freedesktop/ModemManager1/Modem/3 (Pyxon Test "
                             "AT LTE)"),
              1);

    ModemHarness fifth(5);
    fifth.start();
    ASSERT_TRUE(fifth.waitForLog(
        "ModemManager has no modem /org/freedesktop/ModemManager1/Modem/5; waiting for it"));
    EXPECT_EQ(fifth.metricEvents(kRsrpRsrqSinr), 0);
}

TEST_F(ModemSource, TheModemsSignalRateIsPutBackWhenTheSourceStops) {
    fake.start(R"({"scenario": "mbim"})");
    ASSERT_EQ(fake.signalRate(0), 0U);
    modem.start();
    ASSERT_TRUE(showsRsrp("-97"));
    EXPECT_EQ(fake.signalRate(0), 1U);  // polled every 200 ms: the shortest rate, 1 s
    modem.transport().stopEvents();
    EXPECT_EQ(fake.signalRate(0), 0U);
}

TEST_F(ModemSource, ModemManagerAbsentAtStartIsSaidOnceAndWaitedFor) {
    modem.start();
    ASSERT_TRUE(modem.waitForLog("ModemManager is not running"));
    fake.start(R"({"scenario": "mbim"})");
    ASSERT_TRUE(showsRsrp("-97"));
    EXPECT_EQ(modem.logLines("ModemManager is not running"), 1);
}

TEST_F(ModemSource, NoModemYetIsSaidOnceAndTheModemIsTakenWhenItComes) {
    fake.start(R"({"modem": false})");
    modem.start();
    ASSERT_TRUE(modem.waitForLog("ModemManager knows no modem yet; waiting for one"));
    fake.addModem("mbim", 0);
    ASSERT_TRUE(showsRsrp("-97"));
    EXPECT_EQ(modem.logLines("knows no modem yet"), 1);
}

TEST_F(ModemSource, RefusedSignalSetupAndCellInfoAreSaidAndTheRestIsShown) {
    fake.start(R"({"scenario": "refusing"})");
    modem.start();
    ASSERT_TRUE(showsRsrp("-97"));
    ASSERT_TRUE(modem.waitFor(
        [&] { return modem.shown("LTE", "Serving Cell Info", "cell_id").has_value(); }));
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Info", "cell_id"), "1234");
    const int polls = modem.metricEvents(kRsrpRsrqSinr);
    ASSERT_TRUE(modem.waitFor([&] { return modem.metricEvents(kRsrpRsrqSinr) >= polls + 3; }));
    EXPECT_EQ(modem.logLines("ModemManager refused Signal.Setup on "
                             "/org/freedesktop/ModemManager1/Modem/0 for want of authorisation "
                             "(org.freedesktop.DBus.Error.AccessDenied)"),
              1);
    EXPECT_EQ(modem.logLines("ModemManager refused GetCellInfo"), 1);
}

TEST_F(ModemSource, AMethodThatTimesOutIsSaidOnceAndTheRestIsStillShown) {
    fake.start(R"({"scenario": "slow", "delay": 2.5})");  // the transport waits 2 s at most
    modem.start();
    ASSERT_TRUE(showsRsrp("-97"));
    ASSERT_TRUE(modem.waitForLog("ModemManager did not answer GetCellInfo within 2000 ms"));
    const int polls = modem.metricEvents(kRsrpRsrqSinr);
    ASSERT_TRUE(modem.waitFor([&] { return modem.metricEvents(kRsrpRsrqSinr) >= polls + 2; }));
    EXPECT_EQ(modem.logLines("did not answer GetCellInfo"), 1);
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Meas", "rsrp0"), "-97");
}

TEST_F(ModemSource, ALateAnswerToTheModemListKeepsTheModemAndWhatItRefused) {
    fake.start(R"({"scenario": "refusing"})");
    modem.start();
    ASSERT_TRUE(showsRsrp("-97"));
    ASSERT_TRUE(modem.waitForLog("ModemManager refused GetCellInfo"));
    fake.stall(std::chrono::milliseconds(3000));  // the transport waits 2 s at most
    ASSERT_TRUE(modem.waitForLog("ModemManager did not answer GetManagedObjects within 2000 ms"));
    const int polls = modem.metricEvents(kRsrpRsrqSinr);
    ASSERT_TRUE(modem.waitFor([&] { return modem.metricEvents(kRsrpRsrqSinr) >= polls + 3; }));
    EXPECT_EQ(modem.logLines("using the modem /org/freedesktop/ModemManager1/Modem/0"), 1);
    EXPECT_EQ(modem.logLines("ModemManager refused Signal.Setup"), 1);
    EXPECT_EQ(modem.logLines("ModemManager refused GetCellInfo"), 1);
}

TEST_F(ModemSource, WrongTypesAndMalformedStringsAreLeftOutWithOneLineEach) {
    fake.start(R"({"scenario": "malformed"})");
    modem.start();
    modem.querySimFiles();
    // The one good value of Signal.Lte shows; the others are left out.
    ASSERT_TRUE(
        modem.waitFor([&] { return modem.shown("LTE", "Serving Cell Meas", "sinr0") == "13.5"; }));
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Meas", "rsrp0"), std::nullopt);
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Meas", "rsrq0"), std::nullopt);
    const int polls = modem.metricEvents(kRsrpRsrqSinr);
    ASSERT_TRUE(modem.waitFor([&] { return modem.metricEvents(kRsrpRsrqSinr) >= polls + 3; }));

    // The serving cell, its neighbours and the NAS say nothing they could not read.
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Info", "phy_cell_id"), std::nullopt);
    EXPECT_EQ(modem.shown("LTE", "Serving Cell Info", "dl_freq"), std::nullopt);
    EXPECT_EQ(modem.shown("LTE", "NAS", "reg_status"), std::nullopt);
    ASSERT_EQ(modem.sections("LTE", "LTE Neighbor Cell Meas"), 1);
    EXPECT_EQ(modem.shown("LTE", "LTE Neighbor Cell Meas", "nbr_rsrp"), std::nullopt);
    EXPECT_EQ(modem.sections("LTE", "Active Bearers"), 1);
    EXPECT_EQ(modem.shown("LTE", "Active Bearers", "apn"), std::nullopt);
    EXPECT_EQ(modem.shown("LTE", "Active Bearers", "pdp_addr"),
              "<20010db8 00000000 00000000 00000002>");
    // Of the SIM, only the MNC length of its operator could be read.
    ASSERT_TRUE(modem.waitFor([&] { return modem.sections("Device Info", "SIM Files") == 1; }));
    EXPECT_EQ(modem.shown("Device Info", "SIM Files", "ef_id"), "28589");

    // Each fault is said once, however many polls saw it.
    for (const char* line :
         {"ModemManager Signal.Lte rsrp: 'strong' is a string (s), not a double (d)",
          "ModemManager Signal.Lte rsrq: -500.0 is out of range -43..20",
          "ModemManager Signal.Umts rscp: 'weak' is a string (s)",
          "ModemManager Signal.Umts ecio: -30.0 is out of range",
          "ModemManager Signal.Gsm rssi: 5.0 is out of range",
          "ModemManager GetCellInfo LTE cell physical-ci: 'XYZ' is not a hexadecimal number",
          "ModemManager GetCellInfo LTE cell tac: 'zz' is not a hexadecimal number",
          "ModemManager GetCellInfo LTE cell ci: 5 is an unsigned integer",
          "ModemManager GetCellInfo LTE cell earfcn: 'abc' is a string (s)",
          "ModemManager GetCellInfo LTE cell rsrp: -500.0 is out of range",
          "ModemManager GetCellInfo serving: 'yes' is not a boolean (b)",
          "ModemManager GetCellInfo cell-type: 'lte' is not an unsigned",
          "ModemManager Modem3gpp OperatorCode: '26x01' is not an operator code",
          "ModemManager Modem3gpp RegistrationState: 'home' is a string (s)",
          "ModemManager Modem AccessTechnologies: 'lte' is a string (s)",
          "ModemManager Sim SimIdentifier: '8949ABC' is not 18..22 digits",
          "ModemManager Sim Imsi: 5 is an unsigned integer",
          "ModemManager Bearer.Properties apn: 3 is an unsigned integer",
          "ModemManager Bearer.Properties ip-type: 9 is out of range 1..4",
          "ModemManager Bearer.Ip4Config address: '999.1.1.1' is not an address"}) {
        EXPECT_EQ(modem.logLines(line), 1) << line;
    }
}

}  // namespace
}  // namespace pyx::test
