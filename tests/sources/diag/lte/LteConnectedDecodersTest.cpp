// The LTE connected-mode decoders (0xB193 serving cell measurement response, 0xB195
// connected-mode neighbour measurements) against the peers' vectors, on real packets of the
// captures whose values were checked by hand, and through the store to the screens.
#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <iomanip>
#include <sstream>
#include <variant>

#include "metrics/MetricCatalogue.h"
#include "metrics/MetricValidator.h"
#include "sources/diag/decode/ByteReader.h"
#include "tests/sources/diag/support/DiagVectors.h"
#include "tests/sources/diag/umts/DecoderHarness.h"
#include "tests/sources/modem/ScreenText.h"

namespace pyx::diag::test {
namespace {

namespace id = decode::id;

constexpr std::uint16_t kServingMeas = 0xB193;
constexpr std::uint16_t kNeighbourMeas = 0xB195;
constexpr std::array kConnectedCodes{kServingMeas, kNeighbourMeas};

std::span<const LogDecoderRow> table() {
    return lteConnectedDecoders();
}

std::string hexOf(std::span<const std::uint8_t> bytes) {
    std::ostringstream out;
    for (const std::uint8_t b : bytes) out << std::hex << std::setw(2) << std::setfill('0') << +b;
    return out.str();
}

std::uint16_t codeOf(const Vector& v) {
    return static_cast<std::uint16_t>(std::stoi(v.logCode, nullptr, 16));
}

Decoded decodeVector(const std::string& id, DecodeState& state) {
    const Vector& v = vector(id);
    return decode(table(), codeOf(v), v.bytes, state);
}

// The index-th packet of code in a capture, checked to begin with the bytes read by hand.
Bytes capturedPacket(const std::string& file, std::uint16_t code, std::size_t index,
                     const std::string& firstBytes) {
    const auto payloads = capturePayloads(file, code);
    if (index >= payloads.size()) {
        ADD_FAILURE() << file << " has " << payloads.size() << " packets of " << code;
        return {};
    }
    const Bytes& p = payloads[index];
    EXPECT_EQ(hexOf(std::span(p).first(std::min(p.size(), firstBytes.size() / 2))), firstBytes)
        << file << " packet " << index;
    return p;
}

// A copy of the index-th element of list in the one event of metricID among events.
Dict elementOf(const std::vector<MetricOut>& events, std::int64_t metricID, const std::string& list,
               std::size_t index = 0) {
    return element(eventOf(events, metricID), list, index);
}

std::int64_t integer(const Dict& dict, const std::string& key) {
    const Value* v = dict.find(key);
    EXPECT_NE(v, nullptr) << key;
    return v == nullptr ? 0 : v->toInt64().value_or(0);
}

// ---- the peers' vectors -------------------------------------------------------------------

// v007 (sub-packet v36): EARFCN 1600, one cell, PCI 416, the primary cell (index 0, serving).
// Its powers, read by hand: RSRP rx0 -104.875, rx1 -110.375, combined -104.875 dBm (raw + 40
// dB); RSRQ rx0 -14.125, rx1 -25.4375, combined -14.125 dB; RSSI -67.9375 dBm; SNR rx0 -3.3,
// rx1 -13.0 dB.
TEST(LteConnectedVectors, ServingMeasV36GivesThePrimaryCellAsThePeerReadsIt) {
    PYX_NEED_SHARED_DIAG();
    const auto& expect = vector("v007").expect;
    DecodeState state;
    const Decoded d = decodeVector("v007", state);
    ASSERT_TRUE(d.decoded);
    const auto& cell = expect["cells"][0];
    ASSERT_EQ(cell["serving_cell_index"].get<int>(), 0);
    ASSERT_EQ(cell["is_serving_cell"].get<int>(), 1);

    const Dict meas = eventOf(d.events, id::K_LTE_RSRP_RSRQ_SINR);
    ASSERT_EQ(lengthOf(meas, "inst_values"), 1U);
    EXPECT_FALSE(meas.contains("avg_values"));
    const Dict& sample = element(meas, "inst_values", 0);
    EXPECT_EQ(text(sample, "phy_cell_id"), std::to_string(cell["pci"].get<int>()));
    EXPECT_EQ(text(sample, "rsrp0"), "-105");
    EXPECT_EQ(text(sample, "rsrp1"), "-110");
    EXPECT_EQ(text(sample, "rsrq0"), "-14");
    EXPECT_EQ(text(sample, "rsrq1"), "-25");
    EXPECT_EQ(text(sample, "sinr0"), "-7");   // -3.3 dB in half dB
    EXPECT_EQ(text(sample, "sinr1"), "-26");  // -13.0 dB

    const Dict status = eventOf(d.events, id::K_LTE_CA_STATUS);
    ASSERT_EQ(lengthOf(status, "scc_list"), 1U);
    const Dict& pcell = element(status, "scc_list", 0);
    EXPECT_EQ(text(pcell, "index"), "0");
    EXPECT_EQ(text(pcell, "pci"), "416");
    EXPECT_EQ(text(pcell, "dl_earfcn"), std::to_string(expect["earfcn"].get<int>()));
    EXPECT_EQ(text(pcell, "dl_rf_band"), "3");
    EXPECT_NEAR(integer(pcell, "rsrp") / 100.0, -104.875, vector("v007").tolerance);
    EXPECT_NEAR(integer(pcell, "rsrq") / 100.0, -14.125, vector("v007").tolerance);
    EXPECT_NEAR(integer(pcell, "rssi") / 100.0, -67.9375, vector("v007").tolerance);
    EXPECT_EQ(text(pcell, "snr"), "-3");
    EXPECT_FALSE(pcell.contains("state"));  // activation is not in the packet
    EXPECT_FALSE(pcell.contains("dl_bandwidth"));
    EXPECT_EQ(lengthOf(eventOf(d.events, id::K_LTE_SECONDARYCELL_MEAS), "scc_rx_measurement"), 0U);
    const Dict carriers = eventOf(d.events, id::K_LTE_COMPCARR_INFO);
    EXPECT_EQ(text(carriers, "pcc_earfcn"), "1600");
    EXPECT_FALSE(carriers.contains("scc0_earfcn"));
    EXPECT_FALSE(carriers.contains("pcc_bandwidth"));
}

// v008 (sub-packet v48): EARFCN 1444, a secondary cell (index 1, PCI 94) and a cell of its
// frequency that does not serve (PCI 93). By hand: RSRP rx0 -105.5625, rx1 -112.125,
// combined -105.5625 dBm; RSRQ -12.5 dB; RSSI -76.0625 dBm; SNR rx0 10.1 dB. The cell that
// does not serve (-108.9375 dBm, RSSI -76.25 dBm on the same carrier) is not a carrier.
TEST(LteConnectedVectors, ServingMeasV48GivesTheSecondaryCellAsThePeerReadsIt) {
    PYX_NEED_SHARED_DIAG();
    const auto& expect = vector("v008").expect;
    ASSERT_EQ(expect["cells"].size(), 2U);
    DecodeState state;
    const Decoded d = decodeVector("v008", state);
    ASSERT_TRUE(d.decoded);
    EXPECT_EQ(countOf(d.events, id::K_LTE_RSRP_RSRQ_SINR), 0U);  // no primary cell in it

    const Dict status = eventOf(d.events, id::K_LTE_CA_STATUS);
    ASSERT_EQ(lengthOf(status, "scc_list"), 1U);
    const Dict& scell = element(status, "scc_list", 0);
    const auto& serving = expect["cells"][0];
    EXPECT_EQ(serving["is_serving_cell"].get<int>(), 1);
    EXPECT_EQ(expect["cells"][1]["is_serving_cell"].get<int>(), 0);
    EXPECT_EQ(text(scell, "index"), std::to_string(serving["serving_cell_index"].get<int>()));
    EXPECT_EQ(text(scell, "pci"), std::to_string(serving["pci"].get<int>()));
    EXPECT_EQ(text(scell, "dl_earfcn"), std::to_string(expect["earfcn"].get<int>()));
    EXPECT_NEAR(integer(scell, "rsrp") / 100.0, -105.5625, vector("v008").tolerance);
    EXPECT_NEAR(integer(scell, "rsrq") / 100.0, -12.5, vector("v008").tolerance);
    EXPECT_NEAR(integer(scell, "rssi") / 100.0, -76.0625, vector("v008").tolerance);
    EXPECT_EQ(text(scell, "snr"), "10");

    const Dict secondary = eventOf(d.events, id::K_LTE_SECONDARYCELL_MEAS);
    ASSERT_EQ(lengthOf(secondary, "scc_rx_measurement"), 1U);
    const Dict& rx = element(secondary, "scc_rx_measurement", 0);
    EXPECT_EQ(text(rx, "index"), "1");
    EXPECT_EQ(text(rx, "rsrp"), text(scell, "rsrp"));
    EXPECT_EQ(text(rx, "snr"), "10");
    const Dict carriers = eventOf(d.events, id::K_LTE_COMPCARR_INFO);
    EXPECT_FALSE(carriers.contains("pcc_earfcn"));
    EXPECT_EQ(text(carriers, "scc0_earfcn"), "1444");
}

TEST(LteConnectedVectors, CarriersOfSeparatePacketsAreListedTogetherByIndex) {
    PYX_NEED_SHARED_DIAG();
    DecodeState state;
    ASSERT_TRUE(decodeVector("v008", state).decoded);
    const Decoded d = decodeVector("v007", state);
    ASSERT_TRUE(d.decoded);
    const Dict status = eventOf(d.events, id::K_LTE_CA_STATUS);
    ASSERT_EQ(lengthOf(status, "scc_list"), 2U);
    EXPECT_EQ(text(element(status, "scc_list", 0), "dl_earfcn"), "1600");
    EXPECT_EQ(text(element(status, "scc_list", 1), "dl_earfcn"), "1444");
    const Dict carriers = eventOf(d.events, id::K_LTE_COMPCARR_INFO);
    EXPECT_EQ(text(carriers, "pcc_earfcn"), "1600");
    EXPECT_EQ(text(carriers, "scc0_earfcn"), "1444");
    EXPECT_EQ(lengthOf(eventOf(d.events, id::K_LTE_SECONDARYCELL_MEAS), "scc_rx_measurement"), 1U);
}

// The connected-mode LTE vectors that no row of this table takes, and why.
struct Unused {
    const char* id;
    const char* why;
};
constexpr const char* kRach =
    "0xB062 MAC RACH attempt: preamble power and timing advance "
    "belong to the Tx power table, not to this one";
constexpr const char* kMacDl = "0xB063 MAC downlink transport blocks: no screen shows them";
constexpr const char* kMacUl = "0xB064 MAC uplink transport blocks: no screen shows them";
constexpr const char* kPdcp = "PDCP ciphered or integrity-protected PDUs: no screen shows them";
constexpr const char* kV60 =
    "0xB193 sub-packet v60: no peer decodes it and no layout is known; "
    "refused and counted";
constexpr Unused kUnusedVectors[] = {
    {"v009", kV60},   {"v010", kV60},   {"v013", kRach},  {"v014", kRach},  {"v015", kRach},
    {"v016", kRach},  {"v017", kRach},  {"v018", kRach},  {"v019", kMacDl}, {"v020", kMacDl},
    {"v021", kMacDl}, {"v022", kMacDl}, {"v023", kMacDl}, {"v024", kMacUl}, {"v025", kMacUl},
    {"v026", kMacUl}, {"v027", kMacUl}, {"v028", kMacUl}, {"v029", kMacUl}, {"v030", kMacUl},
    {"v031", kPdcp},  {"v032", kPdcp},  {"v033", kPdcp},  {"v133", kRach},  {"v134", kRach},
    {"v135", kRach},  {"v136", kRach},  {"v137", kRach},  {"v138", kRach},
};

bool isConnectedModeCode(const std::string& code) {
    for (const char* c :
         {"0xB193", "0xB195", "0xB062", "0xB063", "0xB064", "0xB0A3", "0xB0B3", "0xB0B5"})
        if (code == c) return true;
    return false;
}

TEST(LteConnectedVectors, EveryConnectedModeVectorIsUsedOrSaysWhyNot) {
    PYX_NEED_SHARED_DIAG();
    for (const Unused& unused : kUnusedVectors) {
        const Vector& v = vector(unused.id);
        DecodeState state;
        EXPECT_FALSE(decode(table(), codeOf(v), v.bytes, state).decoded)
            << unused.id << ": " << unused.why;
    }
    std::size_t seen = 0;
    for (const Vector& v : vectors()) {
        if (v.kind != "log" || !isConnectedModeCode(v.logCode)) continue;
        ++seen;
        const bool listed = std::any_of(std::begin(kUnusedVectors), std::end(kUnusedVectors),
                                        [&](const Unused& u) { return v.id == u.id; });
        const bool used = v.id == "v007" || v.id == "v008";
        EXPECT_TRUE(listed != used) << v.id << " " << v.logCode;
    }
    EXPECT_EQ(seen, std::size(kUnusedVectors) + 2);
}

TEST(LteConnectedDecoders, EveryPrefixOfAPacketIsRefusedUntilItIsWhole) {
    PYX_NEED_SHARED_DIAG();
    std::vector<std::pair<std::uint16_t, Bytes>> packets;
    for (const char* id : {"v007", "v008", "v009", "v010"})
        packets.emplace_back(codeOf(vector(id)), vector(id).bytes);
    for (const auto code : kConnectedCodes)
        packets.emplace_back(code, capturePayloads("mi-unittest-att.mi2log", code).at(0));
    packets.emplace_back(kServingMeas,
                         capturePayloads("mi-offline_log_example.mi2log", kServingMeas).at(0));
    for (const auto& [code, bytes] : packets) {
        for (std::size_t n = 0; n < bytes.size(); ++n) {
            const Bytes prefix(bytes.begin(), bytes.begin() + static_cast<std::ptrdiff_t>(n));
            DecodeState state;
            const Decoded d = decode(table(), code, prefix, state);
            EXPECT_FALSE(d.decoded) << code << " cut to " << n;
            EXPECT_TRUE(state.lte.connected.carriers.empty()) << code << " cut to " << n;
            EXPECT_TRUE(state.lte.connected.neighbours.empty()) << code << " cut to " << n;
        }
    }
}

// Sub-packet versions no layout is known for, and sub-packets of other ids, are refused.
TEST(LteConnectedDecoders, UnknownSubPacketsAreRefused) {
    PYX_NEED_SHARED_DIAG();
    Bytes v36 = vector("v007").bytes;
    DecodeState state;
    for (const std::uint8_t version : {4, 7, 22, 24, 35, 40, 50, 59, 60}) {
        v36[5] = version;
        EXPECT_FALSE(decode(table(), kServingMeas, v36, state).decoded) << +version;
    }
    v36[5] = 36;
    v36[4] = 0x1A;
    EXPECT_FALSE(decode(table(), kServingMeas, v36, state).decoded);
    v36[4] = 0x19;
    v36[0] = 2;  // container version
    EXPECT_FALSE(decode(table(), kServingMeas, v36, state).decoded);
    EXPECT_TRUE(state.lte.connected.carriers.empty());

    Bytes neighbours = capturePayloads("mi-unittest-att.mi2log", kNeighbourMeas).at(0);
    const std::size_t response = 4 + (neighbours[6] | neighbours[7] << 8);
    ASSERT_EQ(neighbours[response], 0x1F);
    for (const std::uint8_t version : {2, 5, 24}) {
        neighbours[response + 1] = version;
        EXPECT_FALSE(decode(table(), kNeighbourMeas, neighbours, state).decoded) << +version;
    }
    EXPECT_TRUE(state.lte.connected.neighbours.empty());
}

TEST(LteConnectedDecoders, NoisePayloadsNeverReadPastTheirEndAndWhatIsWrittenDecodes) {
    feedNoise(table());
    // The same with the containers' headers right and the bodies random, for every known
    // sub-packet, so that the cell loops run on nonsense.
    std::uint32_t seed = 0x9E3779B9;
    const auto next = [&] {
        seed ^= seed << 13;
        seed ^= seed >> 17;
        seed ^= seed << 5;
        return seed;
    };
    struct Sub {
        std::uint16_t code;
        std::uint8_t id;
        std::uint8_t version;
    };
    constexpr Sub kSubs[] = {{kServingMeas, 0x19, 18},  {kServingMeas, 0x19, 19},
                             {kServingMeas, 0x19, 36},  {kServingMeas, 0x19, 48},
                             {kNeighbourMeas, 0x1F, 3}, {kNeighbourMeas, 0x1F, 4}};
    std::size_t taken = 0;
    DecodeState state;
    for (const Sub& sub : kSubs) {
        for (std::size_t body = 0; body <= 600; ++body) {
            for (int round = 0; round < 4; ++round) {
                Bytes payload{1,
                              1,
                              0,
                              0,
                              sub.id,
                              sub.version,
                              static_cast<std::uint8_t>((body + 4) & 0xFF),
                              static_cast<std::uint8_t>((body + 4) >> 8)};
                for (std::size_t i = 0; i < body; ++i)
                    payload.push_back(static_cast<std::uint8_t>(next() % (round < 2 ? 4 : 256)));
                const Decoded d =
                    decode(table(), sub.code, payload, state, kTimeMs + next() % 5000);
                if (!d.decoded) continue;
                ++taken;
                for (const MetricOut& e : d.events) {
                    const MetricKind* kind = findMetricKind(e.metricID);
                    ASSERT_NE(kind, nullptr);
                    EXPECT_TRUE(std::holds_alternative<Dict>(kind->decode(e.payload)));
                }
            }
        }
    }
    EXPECT_GT(taken, 0U);
}

// ---- real packets of the captures, checked by hand ----------------------------------------

constexpr const char* kAtt = "mi-unittest-att.mi2log";
constexpr const char* kTmobile = "mi-unittest-tmobile.mi2log";
constexpr const char* kBler = "mi-bler_sample.mi2log";
constexpr const char* kOffline = "mi-offline_log_example.mi2log";

// AT&T (2016), 0xB193 sub-packet v19, numbers 0 and 1: the phone aggregates two carriers,
// both PCI 185, logged in turn every 10 ms. Number 0 is the primary cell on EARFCN 5780
// (band 17): RSRP rx0 -112.9375, rx1 -109.5, combined -109.5 dBm (the better chain: v19 has
// no 40 dB offset); RSRQ rx0 -8.875, rx1 -9.25, combined -8.875 dB; RSSI -83.25 dBm; SNR rx0
// 4.9, rx1 5.3 dB. Number 1 is the secondary cell (index 1) on EARFCN 700 (band 2): RSRP
// -107.0 dBm, RSRQ -7.1875 dB, RSSI -82.8125 dBm, SNR rx0 9.1 dB.
TEST(LteConnectedCaptures, AttServingMeasV19GivesBothAggregatedCarriers) {
    PYX_NEED_SHARED_DIAG();
    DecodeState state;
    const Decoded primary = decode(
        table(), kServingMeas,
        capturedPacket(kAtt, kServingMeas, 0, "0101f04b19136c019416000001000000b9100000"), state);
    ASSERT_TRUE(primary.decoded);
    const Dict sample = elementOf(primary.events, id::K_LTE_RSRP_RSRQ_SINR, "inst_values", 0);
    EXPECT_EQ(text(sample, "phy_cell_id"), "185");
    EXPECT_EQ(text(sample, "rsrp0"), "-113");
    EXPECT_EQ(text(sample, "rsrp1"), "-110");
    EXPECT_EQ(text(sample, "rsrq0"), "-9");
    EXPECT_EQ(text(sample, "rsrq1"), "-9");
    EXPECT_EQ(text(sample, "sinr0"), "10");  // 4.9 dB in half dB
    EXPECT_EQ(text(sample, "sinr1"), "11");  // 5.3 dB

    const Decoded secondary = decode(
        table(), kServingMeas,
        capturedPacket(kAtt, kServingMeas, 1, "0101f04b19136c01bc02000001000000b9120000"), state);
    ASSERT_TRUE(secondary.decoded);
    EXPECT_EQ(countOf(secondary.events, id::K_LTE_RSRP_RSRQ_SINR), 0U);
    const Dict status = eventOf(secondary.events, id::K_LTE_CA_STATUS);
    ASSERT_EQ(lengthOf(status, "scc_list"), 2U);
    const Dict& pcell = element(status, "scc_list", 0);
    EXPECT_EQ(text(pcell, "index"), "0");
    EXPECT_EQ(text(pcell, "pci"), "185");
    EXPECT_EQ(text(pcell, "dl_earfcn"), "5780");
    EXPECT_EQ(text(pcell, "dl_rf_band"), "17");
    EXPECT_EQ(text(pcell, "rsrp"), "-10950");
    EXPECT_EQ(text(pcell, "rsrq"), "-888");  // -8.875 dB to the nearest hundredth
    EXPECT_EQ(text(pcell, "rssi"), "-8325");
    EXPECT_EQ(text(pcell, "snr"), "5");
    const Dict& scell = element(status, "scc_list", 1);
    EXPECT_EQ(text(scell, "index"), "1");
    EXPECT_EQ(text(scell, "pci"), "185");
    EXPECT_EQ(text(scell, "dl_earfcn"), "700");
    EXPECT_EQ(text(scell, "dl_rf_band"), "2");
    EXPECT_EQ(text(scell, "rsrp"), "-10700");
    EXPECT_EQ(text(scell, "rsrq"), "-719");
    EXPECT_EQ(text(scell, "rssi"), "-8281");
    EXPECT_EQ(text(scell, "snr"), "9");
    const Dict rx = eventOf(secondary.events, id::K_LTE_SECONDARYCELL_MEAS);
    ASSERT_EQ(lengthOf(rx, "scc_rx_measurement"), 1U);
    EXPECT_EQ(text(element(rx, "scc_rx_measurement", 0), "rsrp"), "-10700");
    const Dict carriers = eventOf(secondary.events, id::K_LTE_COMPCARR_INFO);
    EXPECT_EQ(text(carriers, "pcc_earfcn"), "5780");
    EXPECT_EQ(text(carriers, "scc0_earfcn"), "700");
    EXPECT_FALSE(carriers.contains("scc1_earfcn"));
}

// T-Mobile (2016), 0xB193 v19 number 0: EARFCN 2075 (band 4), PCI 42, RSRP rx0 -115.25, rx1
// -110.875 dBm, RSRQ rx0 -12.6875, rx1 -15.75 dB, SNR rx0 4.6, rx1 -0.2 dB.
TEST(LteConnectedCaptures, TmobileServingMeasV19GivesThePrimaryCell) {
    PYX_NEED_SHARED_DIAG();
    DecodeState state;
    const Decoded d = decode(
        table(), kServingMeas,
        capturedPacket(kTmobile, kServingMeas, 0, "010138a419136c011b080000010000002a100000"),
        state);
    ASSERT_TRUE(d.decoded);
    const Dict sample = elementOf(d.events, id::K_LTE_RSRP_RSRQ_SINR, "inst_values", 0);
    EXPECT_EQ(text(sample, "phy_cell_id"), "42");
    EXPECT_EQ(text(sample, "rsrp0"), "-115");
    EXPECT_EQ(text(sample, "rsrp1"), "-111");
    EXPECT_EQ(text(sample, "rsrq0"), "-13");
    EXPECT_EQ(text(sample, "rsrq1"), "-16");
    EXPECT_EQ(text(sample, "sinr0"), "9");
    EXPECT_EQ(text(sample, "sinr1"), "0");
    const Dict pcell = elementOf(d.events, id::K_LTE_CA_STATUS, "scc_list", 0);
    EXPECT_EQ(text(pcell, "dl_earfcn"), "2075");
    EXPECT_EQ(text(pcell, "dl_rf_band"), "4");
    EXPECT_EQ(text(pcell, "rsrp"), "-11088");  // -110.875 dBm
}

// The offline example (2016), 0xB193 v18 number 0: EARFCN 5780, PCI 405, the cell laid out
// as in v19 right after the EARFCN: RSRP rx0 -96.5, rx1 -100.625 dBm, RSRQ rx0 -11.375,
// rx1 -10.9375 (combined the better, -10.9375) dB, RSSI -68.1875 dBm, SNR rx0 11.6, rx1 8.9 dB.
// Read a byte later, as MobileInsight's v18 table has it, every RSRP of the file would be -179.7
// dBm.
TEST(LteConnectedCaptures, OfflineServingMeasV18GivesThePrimaryCell) {
    PYX_NEED_SHARED_DIAG();
    DecodeState state;
    const Decoded d = decode(
        table(), kServingMeas,
        capturedPacket(kOffline, kServingMeas, 0, "010100001912600094160000951100003d160000"),
        state);
    ASSERT_TRUE(d.decoded);
    const Dict sample = elementOf(d.events, id::K_LTE_RSRP_RSRQ_SINR, "inst_values", 0);
    EXPECT_EQ(text(sample, "phy_cell_id"), "405");
    EXPECT_EQ(text(sample, "rsrp0"), "-97");  // -96.5, halves away from zero
    EXPECT_EQ(text(sample, "rsrp1"), "-101");
    EXPECT_EQ(text(sample, "rsrq0"), "-11");
    EXPECT_EQ(text(sample, "sinr0"), "23");
    EXPECT_EQ(text(sample, "sinr1"), "18");
    const Dict pcell = elementOf(d.events, id::K_LTE_CA_STATUS, "scc_list", 0);
    EXPECT_EQ(text(pcell, "rsrp"), "-9650");
    EXPECT_EQ(text(pcell, "rsrq"), "-1094");
    EXPECT_EQ(text(pcell, "rssi"), "-6819");
}

// bler_sample (2019), 0xB193 v36. Number 0: EARFCN 1825 (band 3), PCI 73, RSRP rx0 -99.3125,
// rx1 -98.5625, combined -98.5625 dBm. Number 2 adds two cells of the frequency that do not
// serve (PCI 220 at -111.125 dBm, PCI 72 at -116.6875 dBm): still only the primary cell is a
// carrier.
TEST(LteConnectedCaptures, BlerServingMeasV36GivesOnlyTheServingCell) {
    PYX_NEED_SHARED_DIAG();
    DecodeState state;
    const Decoded first = decode(
        table(), kServingMeas,
        capturedPacket(kBler, kServingMeas, 0, "0101000019240c02210700000100030049100000"), state);
    ASSERT_TRUE(first.decoded);
    const Dict sample = elementOf(first.events, id::K_LTE_RSRP_RSRQ_SINR, "inst_values", 0);
    EXPECT_EQ(text(sample, "phy_cell_id"), "73");
    EXPECT_EQ(text(sample, "rsrp0"), "-99");
    EXPECT_EQ(text(sample, "rsrp1"), "-99");
    EXPECT_EQ(text(element(eventOf(first.events, id::K_LTE_CA_STATUS), "scc_list", 0), "rsrp"),
              "-9856");  // -98.5625 dBm: raw + 40 dB

    const Decoded third = decode(
        table(), kServingMeas,
        capturedPacket(kBler, kServingMeas, 2, "0101000019240c02210700000300030049100000"), state);
    ASSERT_TRUE(third.decoded);
    EXPECT_EQ(text(element(eventOf(third.events, id::K_LTE_RSRP_RSRQ_SINR), "inst_values", 0),
                   "phy_cell_id"),
              "73");
    const Dict status = eventOf(third.events, id::K_LTE_CA_STATUS);
    ASSERT_EQ(lengthOf(status, "scc_list"), 1U);
    EXPECT_EQ(text(element(status, "scc_list", 0), "rsrp"), "-9919");  // -99.1875 dBm
}

// bler_sample 0xB193 number 1206: valid receive chains 2 (chain 1 only), EARFCN 3683 (band 8),
// PCI 351: chain 1 RSRP -113.0625 dBm, RSRQ -9.6875 dB, SNR 10.8 dB; chain 0 reads the floor
// (-180 dBm, -30 dB, -20 dB) and is left out.
TEST(LteConnectedCaptures, AChainTheModemMarksNotValidIsLeftOut) {
    PYX_NEED_SHARED_DIAG();
    DecodeState state;
    const Decoded d = decode(
        table(), kServingMeas,
        capturedPacket(kBler, kServingMeas, 1206, "0101709219240c02630e0000010002005f110000"),
        state);
    ASSERT_TRUE(d.decoded);
    const Dict sample = elementOf(d.events, id::K_LTE_RSRP_RSRQ_SINR, "inst_values");
    EXPECT_EQ(text(sample, "phy_cell_id"), "351");
    EXPECT_FALSE(sample.contains("rsrp0"));
    EXPECT_FALSE(sample.contains("rsrq0"));
    EXPECT_FALSE(sample.contains("sinr0"));
    EXPECT_EQ(text(sample, "rsrp1"), "-113");
    EXPECT_EQ(text(sample, "rsrq1"), "-10");
    EXPECT_EQ(text(sample, "sinr1"), "22");
    const Dict pcell = elementOf(d.events, id::K_LTE_CA_STATUS, "scc_list");
    EXPECT_EQ(text(pcell, "dl_earfcn"), "3683");
    EXPECT_EQ(text(pcell, "dl_rf_band"), "8");
    EXPECT_EQ(text(pcell, "rsrp"), "-11306");
    EXPECT_EQ(text(pcell, "snr"), "11");  // the valid chain's
}

// AT&T 0xB195 numbers 0 and 1 (request v3, then response v4): on the primary carrier 5780,
// PCI 210 at -117.75 dBm / -16.75 dB and PCI 172 at -123.625 dBm / -20.6875 dB; on the
// secondary carrier 700 (serving-cell index 1), PCI 210 at -112.0625 dBm / -14.375 dB and
// PCI 160 at -115.0 dBm / -17.0625 dB. Their RSSI (-92 and -90 dBm) is that of the serving
// cells' carriers.
TEST(LteConnectedCaptures, AttNeighbourMeasListsTheNeighboursOfBothCarriers) {
    PYX_NEED_SHARED_DIAG();
    DecodeState state;
    const Decoded primary = decode(
        table(), kNeighbourMeas,
        capturedPacket(kAtt, kNeighbourMeas, 0, "0102bdd41e03300094160000220000002828e400"), state);
    ASSERT_TRUE(primary.decoded);
    const Dict first = eventOf(primary.events, id::K_LTE_INTRARAT_MEAS);
    ASSERT_EQ(lengthOf(first, "meas_nbr_eutra"), 2U);
    const Dict& strong = element(first, "meas_nbr_eutra", 0);
    EXPECT_EQ(text(strong, "nbr_earfcn"), "5780");
    EXPECT_EQ(text(strong, "nbr_phys_cell_id"), "210");
    EXPECT_EQ(text(strong, "freq_band_ind"), "17");
    EXPECT_EQ(text(strong, "nbr_rsrp"), "22");  // -118 dBm + 140
    EXPECT_EQ(text(strong, "nbr_rsrq"), "6");   // (-16.5 dB + 19.5) x 2
    const Dict& weak = element(first, "meas_nbr_eutra", 1);
    EXPECT_EQ(text(weak, "nbr_phys_cell_id"), "172");
    EXPECT_EQ(text(weak, "nbr_rsrp"), "16");  // -124 dBm
    EXPECT_EQ(text(weak, "nbr_rsrq"), "0");   // below -19.5 dB

    const Decoded secondary = decode(
        table(), kNeighbourMeas,
        capturedPacket(kAtt, kNeighbourMeas, 1, "01028cee1e033000bc020000620000002828e400"), state);
    ASSERT_TRUE(secondary.decoded);
    const Dict both = eventOf(secondary.events, id::K_LTE_INTRARAT_MEAS);
    ASSERT_EQ(lengthOf(both, "meas_nbr_eutra"), 4U);
    EXPECT_EQ(text(element(both, "meas_nbr_eutra", 0), "nbr_earfcn"), "5780");
    const Dict& other = element(both, "meas_nbr_eutra", 2);
    EXPECT_EQ(text(other, "nbr_earfcn"), "700");
    EXPECT_EQ(text(other, "nbr_phys_cell_id"), "210");
    EXPECT_EQ(text(other, "freq_band_ind"), "2");
    EXPECT_EQ(text(other, "nbr_rsrp"), "28");                              // -112 dBm
    EXPECT_EQ(text(other, "nbr_rsrq"), "10");                              // -14.5 dB
    EXPECT_EQ(text(element(both, "meas_nbr_eutra", 3), "nbr_rsrq"), "5");  // -17.0 dB
}

// A response of version 3 holds the EARFCN in 16 bits and no padding before its cells
// (MobileInsight's tables; no capture has one): the AT&T response number 0 written so reads
// the same.
TEST(LteConnectedCaptures, ANeighbourResponseOfVersion3ReadsAsVersion4Does) {
    PYX_NEED_SHARED_DIAG();
    const Bytes v4 = capturePayloads(kAtt, kNeighbourMeas).at(0);
    const std::size_t response = 4 + static_cast<std::size_t>(v4[6] | v4[7] << 8);
    ASSERT_EQ(v4[response], 0x1F);
    ASSERT_EQ(v4[response + 1], 4);
    const std::size_t size = static_cast<std::size_t>(v4[response + 2] | v4[response + 3] << 8);
    ASSERT_EQ(response + size, v4.size());
    Bytes v3(v4.begin(), v4.begin() + static_cast<std::ptrdiff_t>(response));
    const std::size_t v3Size = size - 4;
    for (const std::uint8_t b :
         {std::uint8_t{0x1F}, std::uint8_t{3}, static_cast<std::uint8_t>(v3Size & 0xFF),
          static_cast<std::uint8_t>(v3Size >> 8), v4[response + 4], v4[response + 5],
          v4[response + 8], v4[response + 9]})
        v3.push_back(b);
    v3.insert(v3.end(), v4.begin() + static_cast<std::ptrdiff_t>(response + 12), v4.end());
    DecodeState state4;
    DecodeState state3;
    const Decoded d4 = decode(table(), kNeighbourMeas, v4, state4);
    const Decoded d3 = decode(table(), kNeighbourMeas, v3, state3);
    ASSERT_TRUE(d4.decoded);
    ASSERT_TRUE(d3.decoded);
    EXPECT_TRUE(eventOf(d3.events, id::K_LTE_INTRARAT_MEAS) ==
                eventOf(d4.events, id::K_LTE_INTRARAT_MEAS));
    EXPECT_EQ(lengthOf(eventOf(d3.events, id::K_LTE_INTRARAT_MEAS), "meas_nbr_eutra"), 2U);
}

// Every 0xB193 and 0xB195 packet of the four captures that have them decodes, and what it
// gives lies where real measurements lie.
TEST(LteConnectedCaptures, EveryPacketOfTheCapturesDecodesToPlausibleValues) {
    PYX_NEED_SHARED_DIAG();
    struct Expected {
        const char* file;
        std::size_t serving;
        std::size_t neighbours;
    };
    for (const Expected& e : {Expected{kAtt, 1091, 224}, Expected{kTmobile, 1071, 237},
                              Expected{kBler, 2792, 0}, Expected{kOffline, 46, 11}}) {
        DecodeState state;
        std::size_t serving = 0;
        std::size_t neighbours = 0;
        for (const CapturedPacket& p : capturePackets(e.file, kConnectedCodes)) {
            const Decoded d = decode(table(), p.code, p.payload, state);
            ASSERT_TRUE(d.decoded)
                << e.file << " " << std::hex << p.code << " " << hexOf(p.payload);
            (p.code == kServingMeas ? serving : neighbours) += 1;
            for (const MetricOut& out : d.events) {
                if (out.metricID == id::K_LTE_RSRP_RSRQ_SINR) {
                    const Dict s = elementOf(d.events, out.metricID, "inst_values");
                    // Chains the modem marks not valid are absent (bler numbers 1206-1468
                    // have chain 1 only). A chain in a deep fade reads below the -140 dBm
                    // floor (bler 1719-1724: -142.3 dBm beside -127.3 dBm on the other),
                    // and an instantaneous RSRQ of one chain may read a little above 0 dB
                    // (bler 107: +0.8 dB, 1262: +1.6 dB).
                    const auto within = [&](const char* key, std::int64_t low, std::int64_t high) {
                        if (!s.contains(key)) return;
                        const std::int64_t v = integer(s, key);
                        EXPECT_TRUE(v >= low && v <= high) << e.file << " " << key << " " << v;
                    };
                    within("rsrp0", -145, -44);
                    within("rsrp1", -145, -44);
                    within("rsrq0", -30, 3);
                    within("rsrq1", -30, 3);
                    within("sinr0", -40, 60);
                    within("sinr1", -40, 60);
                    EXPECT_TRUE(s.contains("rsrp0") || s.contains("rsrp1")) << e.file;
                }
                if (out.metricID == id::K_LTE_CA_STATUS) {
                    const Dict status = eventOf(d.events, out.metricID);
                    EXPECT_GE(lengthOf(status, "scc_list"), 1U);
                    for (std::size_t i = 0; i < lengthOf(status, "scc_list"); ++i) {
                        const Dict& c = element(status, "scc_list", i);
                        EXPECT_TRUE(integer(c, "rsrp") >= -14000 && integer(c, "rsrp") <= -4400);
                        EXPECT_TRUE(integer(c, "rssi") >= -11000 && integer(c, "rssi") <= -2500);
                        EXPECT_TRUE(c.contains("dl_rf_band"));
                    }
                }
                if (out.metricID == id::K_LTE_INTRARAT_MEAS) {
                    const Dict list = eventOf(d.events, out.metricID);
                    for (std::size_t i = 0; i < lengthOf(list, "meas_nbr_eutra"); ++i) {
                        const Dict& c = element(list, "meas_nbr_eutra", i);
                        EXPECT_TRUE(integer(c, "nbr_rsrp") > 0 && integer(c, "nbr_rsrp") < 97);
                        EXPECT_TRUE(c.contains("freq_band_ind"));
                    }
                }
            }
        }
        EXPECT_EQ(serving, e.serving) << e.file;
        EXPECT_EQ(neighbours, e.neighbours) << e.file;
    }
}

// A carrier or neighbour list that the packets of the last 2 s did not measure is dropped
// (AT&T: the secondary carrier stops 1.15 s into the file while the primary goes on).
TEST(LteConnectedCaptures, ACarrierNotMeasuredForTwoSecondsIsNoLongerListed) {
    PYX_NEED_SHARED_DIAG();
    const auto serving = capturePayloads(kAtt, kServingMeas);
    const auto neighbours = capturePayloads(kAtt, kNeighbourMeas);
    DecodeState state;
    ASSERT_TRUE(decode(table(), kServingMeas, serving.at(1), state, kTimeMs).decoded);  // secondary
    ASSERT_TRUE(decode(table(), kNeighbourMeas, neighbours.at(1), state, kTimeMs).decoded);
    const Decoded soon = decode(table(), kServingMeas, serving.at(0), state, kTimeMs + 2000);
    EXPECT_EQ(lengthOf(eventOf(soon.events, id::K_LTE_CA_STATUS), "scc_list"), 2U);
    const Decoded late = decode(table(), kServingMeas, serving.at(2), state, kTimeMs + 2001);
    const Dict status = eventOf(late.events, id::K_LTE_CA_STATUS);
    ASSERT_EQ(lengthOf(status, "scc_list"), 1U);
    EXPECT_EQ(text(element(status, "scc_list", 0), "index"), "0");
    EXPECT_EQ(lengthOf(eventOf(late.events, id::K_LTE_SECONDARYCELL_MEAS), "scc_rx_measurement"),
              0U);
    EXPECT_FALSE(eventOf(late.events, id::K_LTE_COMPCARR_INFO).contains("scc0_earfcn"));
    const Decoded nbr = decode(table(), kNeighbourMeas, neighbours.at(0), state, kTimeMs + 2001);
    const Dict list = eventOf(nbr.events, id::K_LTE_INTRARAT_MEAS);
    ASSERT_EQ(lengthOf(list, "meas_nbr_eutra"), 2U);
    EXPECT_EQ(text(element(list, "meas_nbr_eutra", 1), "nbr_earfcn"), "5780");
}

// ---- through the store to the screens ------------------------------------------------------

TEST(LteConnectedScreens, TheAttPacketsShowOnTheServingCarrierAndNeighbourScreens) {
    PYX_NEED_SHARED_DIAG();
    const auto store = MetricValidator::create(nullptr);
    DecodeState state;
    const auto serving = capturePayloads(kAtt, kServingMeas);
    const auto neighbours = capturePayloads(kAtt, kNeighbourMeas);
    feed(store, decode(table(), kServingMeas, serving.at(0), state).events);
    feed(store, decode(table(), kServingMeas, serving.at(1), state).events);
    feed(store, decode(table(), kNeighbourMeas, neighbours.at(0), state).events);
    feed(store, decode(table(), kNeighbourMeas, neighbours.at(1), state).events);
    const auto shown = [&](const std::string& category, const std::string& key, int section = 0) {
        return pyx::test::shownOn(store, "LTE", category, key, section);
    };
    EXPECT_EQ(shown("Serving Cell Meas", "phy_cell_id"), "185");
    EXPECT_EQ(shown("Serving Cell Meas", "rsrp0"), "-113");
    EXPECT_EQ(shown("Serving Cell Meas", "rsrp1"), "-110");
    EXPECT_EQ(shown("Serving Cell Meas", "rsrq0"), "-9");
    EXPECT_EQ(shown("Serving Cell Meas", "sinr0"), "5.0");
    EXPECT_EQ(shown("Serving Cell Meas", "sinr1"), "5.5");

    ASSERT_EQ(pyx::test::sectionsOn(store, "LTE", "CA Status"), 2);
    EXPECT_EQ(shown("CA Status", "index", 0), "0");
    EXPECT_EQ(shown("CA Status", "dl_earfcn", 0), "5780");
    EXPECT_EQ(shown("CA Status", "dl_rf_band", 0), "17");
    EXPECT_EQ(shown("CA Status", "rsrp", 0), "-109");  // -109.5 dBm, whole dB toward zero
    EXPECT_EQ(shown("CA Status", "rsrq", 0), "-8.88");
    EXPECT_EQ(shown("CA Status", "rssi", 0), "-83");
    EXPECT_EQ(shown("CA Status", "snr", 0), "5");
    EXPECT_EQ(shown("CA Status", "index", 1), "1");
    EXPECT_EQ(shown("CA Status", "dl_earfcn", 1), "700");
    EXPECT_EQ(shown("CA Status", "rsrp", 1), "-107");
    EXPECT_EQ(shown("CA Status", "state", 1), std::nullopt);

    ASSERT_EQ(pyx::test::sectionsOn(store, "LTE", "Secondary Cell Meas"), 1);
    EXPECT_EQ(shown("Secondary Cell Meas", "index"), "1");
    EXPECT_EQ(shown("Secondary Cell Meas", "rsrp"), "-107");
    EXPECT_EQ(shown("Secondary Cell Meas", "rsrq"), "-7.19");
    // The component carrier screen shows the first row of its dictionary only, as for every
    // source; the store holds the carriers' EARFCNs (their bandwidths are not in the packets).
    EXPECT_EQ(shown("Component Carrier Info", "pcc_earfcn"), std::nullopt);
    const auto& components = store->myLTECompCarrDict();
    ASSERT_TRUE(components);
    EXPECT_EQ(text(*components, "pcc_earfcn"), "5780");
    EXPECT_EQ(text(*components, "scc0_earfcn"), "700");
    EXPECT_FALSE(components->contains("pcc_bandwidth"));

    ASSERT_EQ(pyx::test::sectionsOn(store, "LTE", "LTE Neighbor Cell Meas"), 4);
    EXPECT_EQ(shown("LTE Neighbor Cell Meas", "nbr_phys_cell_id", 0), "210");
    EXPECT_EQ(shown("LTE Neighbor Cell Meas", "nbr_rsrp", 0), "-118");
    EXPECT_EQ(shown("LTE Neighbor Cell Meas", "nbr_rsrq", 0), "-16.5");
    EXPECT_EQ(shown("LTE Neighbor Cell Meas", "nbr_earfcn", 2), "700");
    EXPECT_EQ(shown("LTE Neighbor Cell Meas", "nbr_rsrp", 3), "-115");
}

// The modem's time of a captured packet as ms since 1970.
std::uint64_t timeMsOf(const CapturedPacket& packet) {
    constexpr std::uint64_t kGpsEpochMs = 315964800000;  // 1980-01-06 00:00:00
    return kGpsEpochMs + (packet.timestamp >> 16) * 5 / 4;
}

// The whole AT&T capture at the packets' own times, as a replay gives it: at its end
// (2016-01-17 03:42:44) the primary cell's last measurement shows (RSRP rx0 -109.6875, rx1
// -120.5 dBm, RSRQ rx0 -9.875, rx1 -10.5 dB, SNR rx0 5.8, rx1 3.7 dB); the secondary
// carrier, last measured 1.15 s into the file, is gone; the neighbours are those of the last
// 0xB195 (PCI 173 at -114.4375 dBm / -13.5 dB, 210 at -119.375, 160 at -119.8125 dBm).
TEST(LteConnectedScreens, TheWholeAttCaptureEndsOnItsLastMeasurements) {
    PYX_NEED_SHARED_DIAG();
    const auto store = MetricValidator::create(nullptr);
    DecodeState state;
    std::size_t withBothCarriers = 0;
    for (const CapturedPacket& p : capturePackets(kAtt, kConnectedCodes)) {
        const Decoded d = decode(table(), p.code, p.payload, state, timeMsOf(p));
        ASSERT_TRUE(d.decoded);
        feed(store, d.events);
        withBothCarriers += state.lte.connected.carriers.size() == 2 ? 1 : 0;
    }
    EXPECT_GT(withBothCarriers, 200U);
    const auto shown = [&](const std::string& category, const std::string& key, int section = 0) {
        return pyx::test::shownOn(store, "LTE", category, key, section);
    };
    EXPECT_EQ(shown("Serving Cell Meas", "phy_cell_id"), "185");
    EXPECT_EQ(shown("Serving Cell Meas", "rsrp0"), "-110");
    EXPECT_EQ(shown("Serving Cell Meas", "rsrp1"), "-121");
    EXPECT_EQ(shown("Serving Cell Meas", "rsrq0"), "-10");
    EXPECT_EQ(shown("Serving Cell Meas", "rsrq1"), "-11");
    EXPECT_EQ(shown("Serving Cell Meas", "sinr0"), "6.0");
    EXPECT_EQ(shown("Serving Cell Meas", "sinr1"), "3.5");
    ASSERT_EQ(pyx::test::sectionsOn(store, "LTE", "CA Status"), 1);
    EXPECT_EQ(shown("CA Status", "index"), "0");
    EXPECT_EQ(shown("CA Status", "dl_earfcn"), "5780");
    EXPECT_EQ(shown("CA Status", "rsrp"), "-109");
    EXPECT_EQ(pyx::test::sectionsOn(store, "LTE", "Secondary Cell Meas"), 0);
    ASSERT_EQ(pyx::test::sectionsOn(store, "LTE", "LTE Neighbor Cell Meas"), 3);
    EXPECT_EQ(shown("LTE Neighbor Cell Meas", "nbr_phys_cell_id", 0), "173");
    EXPECT_EQ(shown("LTE Neighbor Cell Meas", "nbr_rsrp", 0), "-114");
    EXPECT_EQ(shown("LTE Neighbor Cell Meas", "nbr_rsrq", 0), "-13.5");
    EXPECT_EQ(shown("LTE Neighbor Cell Meas", "nbr_rsrp", 2), "-120");
}

TEST(LteConnectedScreens, TheVectorsShowOnTheCarrierScreens) {
    PYX_NEED_SHARED_DIAG();
    const auto store = MetricValidator::create(nullptr);
    DecodeState state;
    feed(store, decodeVector("v007", state).events);
    feed(store, decodeVector("v008", state).events);
    const auto shown = [&](const std::string& category, const std::string& key, int section = 0) {
        return pyx::test::shownOn(store, "LTE", category, key, section);
    };
    EXPECT_EQ(shown("Serving Cell Meas", "phy_cell_id"), "416");
    EXPECT_EQ(shown("Serving Cell Meas", "rsrp0"), "-105");
    EXPECT_EQ(shown("Serving Cell Meas", "sinr0"), "-3.5");
    EXPECT_EQ(shown("CA Status", "pci", 0), "416");
    EXPECT_EQ(shown("CA Status", "pci", 1), "94");
    EXPECT_EQ(shown("CA Status", "rsrp", 1), "-105");  // -105.5625 dBm
    EXPECT_EQ(shown("Secondary Cell Meas", "snr"), "10");
}

}  // namespace
}  // namespace pyx::diag::test
