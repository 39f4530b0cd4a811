// The NAS decoders on real packets of the captures, whose values were checked by hand against
// the NAS messages around them (no peer has test vectors for these codes), and through the
// store to the screens that show them.
#include <gtest/gtest.h>

#include <array>
#include <iomanip>
#include <sstream>

#include "metrics/MetricValidator.h"
#include "sources/diag/decode/ByteReader.h"
#include "tests/sources/diag/support/DiagVectors.h"
#include "tests/sources/diag/umts/DecoderHarness.h"
#include "tests/sources/modem/ScreenText.h"

namespace pyx::diag::test {
namespace {

namespace id = decode::id;

constexpr std::uint16_t kEmm = 0xB0EE;
constexpr std::uint16_t kEsm = 0xB0E5;
constexpr std::uint16_t kGmm = 0x7130;
constexpr std::uint16_t kMm = 0x7131;
constexpr std::array kNasCodes{kEmm, kEsm, kGmm, kMm};

std::string hexOf(const Bytes& bytes) {
    std::ostringstream out;
    for (const std::uint8_t b : bytes) out << std::hex << std::setw(2) << std::setfill('0') << +b;
    return out.str();
}

// The index-th packet of code in a capture, checked to be the bytes read by hand.
Bytes capturedPacket(const std::string& file, std::uint16_t code, std::size_t index,
                     const std::string& hex) {
    const auto payloads = capturePayloads(file, code);
    if (index >= payloads.size()) {
        ADD_FAILURE() << file << " has " << payloads.size() << " packets of " << code;
        return {};
    }
    EXPECT_EQ(hexOf(payloads[index]), hex) << file << " packet " << index;
    return payloads[index];
}

Dict decodeOne(std::uint16_t code, const Bytes& payload, std::int64_t metricID) {
    DecodeState state;
    const Decoded d = decode(nasDecoders(), code, payload, state);
    EXPECT_TRUE(d.decoded);
    return eventOf(d.events, metricID);
}

// attach_sample, 0xB0EE number 7: EMM REGISTERED, NORMAL_SERVICE, PLMN 311-480, GUTI with
// MMEGI 0xFAE6, MMEC 0xE9, M-TMSI 0xD7216887; the detach request the phone sends next
// (0xB0ED) carries that GUTI as 0b f6 13 01 84 fa e6 e9 d7 21 68 87.
TEST(NasCaptures, EmmStateGivesTheRegistrationAndTheGuti) {
    PYX_NEED_SHARED_DIAG();
    const Bytes registered = capturedPacket("mi-attach_sample.mi2log", kEmm, 7,
                                            "020300001301840106130184e6fae9876821d7");
    const Dict emm = decodeOne(kEmm, registered, id::K_LTE_EMM_CTXT);
    EXPECT_EQ(text(emm, "reg_status"), "KREG_STATUS_NORMAL_SERVICE");
    EXPECT_EQ(text(emm, "reg_proc"), "EMM_PROC_NO_PROC");
    ASSERT_TRUE(emm.contains("guti"));
    const Dict& guti = emm.find("guti")->asDict();
    EXPECT_EQ(text(guti, "mmegi"), "64230");
    EXPECT_EQ(text(guti, "mmec"), "233");
    EXPECT_EQ(text(guti, "m_tmsi"), "3609290887");
    EXPECT_FALSE(emm.contains("update_status"));  // not in the packet
    EXPECT_FALSE(emm.contains("tai_list"));

    // Number 5: REGISTERED_INITIATED (the attach request has just gone out).
    const Dict attaching = decodeOne(kEmm,
                                     capturedPacket("mi-attach_sample.mi2log", kEmm, 5,
                                                    "020200001301840106130184e6fae9886847d3"),
                                     id::K_LTE_EMM_CTXT);
    EXPECT_EQ(text(attaching, "reg_status"), "KREG_STATUS_REGISTRATION_IN_PROGRESS");
    EXPECT_FALSE(attaching.contains("reg_proc"));  // combined or not: the state does not say
    // Number 1: DEREGISTERED, NO_CELL_AVAILABLE.
    const Dict noCell = decodeOne(kEmm,
                                  capturedPacket("mi-attach_sample.mi2log", kEmm, 1,
                                                 "020103001301840106130184e6fae9886847d3"),
                                  id::K_LTE_EMM_CTXT);
    EXPECT_EQ(text(noCell, "reg_status"), "KREG_STATUS_NO_SERVICE");
    // Number 0: DEREGISTERED_INITIATED, which our statuses have no name for.
    const Dict detaching = decodeOne(kEmm,
                                     capturedPacket("mi-attach_sample.mi2log", kEmm, 0,
                                                    "020600001301840106130184e6fae9886847d3"),
                                     id::K_LTE_EMM_CTXT);
    EXPECT_FALSE(detaching.contains("reg_status"));
}

std::vector<std::string> nsapis(const Dict& bearers) {
    std::vector<std::string> out;
    for (std::size_t i = 0; i < lengthOf(bearers, "bearer_contexts"); ++i)
        out.push_back(text(element(bearers, "bearer_contexts", i), "nsapi"));
    EXPECT_EQ(text(bearers, "bearer_context_count"), std::to_string(out.size()));
    return out;
}

using Ids = std::vector<std::string>;

// volte_sample starts with the IMS and internet default bearers active (5 and 6, state 2),
// then a dedicated bearer 7 (QCI 1) is requested (activate dedicated EPS bearer context
// request, state 1).
TEST(NasCaptures, BearerStatesBuildTheListOfActiveBearers) {
    PYX_NEED_SHARED_DIAG();
    const auto esm = capturePayloads("mi-volte_sample.mi2log", kEsm);
    ASSERT_GE(esm.size(), 3U);
    EXPECT_EQ(hexOf(esm[0]), "0100050200ffff000b0400000000000000000000");
    EXPECT_EQ(hexOf(esm[1]), "01000602010001000b0301050000000000000000");
    EXPECT_EQ(hexOf(esm[2]), "0101070102ffff01060005012929292900000000");
    DecodeState state;
    std::vector<Ids> lists;
    for (std::size_t i = 0; i < 3; ++i) {
        const Decoded d = decode(nasDecoders(), kEsm, esm[i], state);
        ASSERT_TRUE(d.decoded);
        lists.push_back(nsapis(eventOf(d.events, id::K_CELLULAR_ACTIVE_BEARER)));
    }
    EXPECT_EQ(lists, (std::vector<Ids>{{"5"}, {"5", "6"}, {"5", "6", "7"}}));
}

// sprint: bearer 6 active; EMM deregisters (the phone attaches again), so the list empties;
// the new attach activates bearer 5 (state 1, then 2) and then bearer 6.
TEST(NasCaptures, DeregistrationEmptiesTheBearerList) {
    PYX_NEED_SHARED_DIAG();
    DecodeState state;
    std::vector<Ids> lists;
    for (const CapturedPacket& packet : capturePackets("mi-unittest-sprint.mi2log", kNasCodes)) {
        const Decoded d = decode(nasDecoders(), packet.code, packet.payload, state);
        ASSERT_TRUE(d.decoded) << hexOf(packet.payload);
        if (countOf(d.events, id::K_CELLULAR_ACTIVE_BEARER) == 1)
            lists.push_back(nsapis(eventOf(d.events, id::K_CELLULAR_ACTIVE_BEARER)));
        if (lists.size() == 5) break;
    }
    EXPECT_EQ(lists, (std::vector<Ids>{{"6"}, {}, {"5"}, {"5"}, {"5", "6"}}));
}

TEST(NasCaptures, EveryNasPacketOfEveryCaptureDecodes) {
    PYX_NEED_SHARED_DIAG();
    std::size_t decoded = 0;
    for (const auto& entry : std::filesystem::directory_iterator(sharedDiag() / "captures")) {
        if (entry.path().extension() != ".mi2log") continue;
        DecodeState state;
        for (const CapturedPacket& packet :
             capturePackets(entry.path().filename().string(), kNasCodes)) {
            const Decoded d = decode(nasDecoders(), packet.code, packet.payload, state);
            EXPECT_TRUE(d.decoded) << entry.path().filename() << " " << hexOf(packet.payload);
            decoded += d.decoded ? 1 : 0;
        }
    }
    EXPECT_GT(decoded, 5000U);
}

// cmcc: the GMM states as the phone leaves a place without coverage and registers.
TEST(NasCaptures, GmmStateGivesTheRegistrationAndUpdateStatus) {
    PYX_NEED_SHARED_DIAG();
    const std::string file = "mi-unittest-cmcc.mi2log";
    const Dict noCell = decodeOne(kGmm, capturedPacket(file, kGmm, 0, "010500"),
                                  id::K_CELLULAR_GMM_CTXT);  // DEREGISTERED, NO_CELL_AVAILABLE
    EXPECT_EQ(text(noCell, "reg_status"), "KREG_STATUS_NO_SERVICE");
    EXPECT_EQ(text(noCell, "update_status"), "GPRS_STATUS_UPDATED");  // GU1
    EXPECT_EQ(text(noCell, "reg_proc"), "KNAS_MM_REG_PROC_PROC_NONE");
    const Dict normal = decodeOne(kGmm, capturedPacket(file, kGmm, 13, "030000"),
                                  id::K_CELLULAR_GMM_CTXT);  // REGISTERED, NORMAL_SERVICE
    EXPECT_EQ(text(normal, "reg_status"), "KREG_STATUS_NORMAL_SERVICE");
    const Dict suspended = decodeOne(kGmm, capturedPacket(file, kGmm, 17, "030700"),
                                     id::K_CELLULAR_GMM_CTXT);  // REGISTERED, SUSPENDED
    EXPECT_FALSE(suspended.contains("reg_status"));
    const Dict updating = decodeOne(kGmm, capturedPacket(file, kGmm, 18, "050000"),
                                    id::K_CELLULAR_GMM_CTXT);  // RAU_INITIATED, NORMAL_SERVICE
    EXPECT_EQ(text(updating, "reg_status"), "KREG_STATUS_NORMAL_SERVICE");
    EXPECT_FALSE(updating.contains("reg_proc"));  // combined or not: the state does not say
}

// cmcc: the MM states: IDLE searching, IDLE in normal service, and MM NULL.
TEST(NasCaptures, MmStateGivesTheRegistrationAndUpdateStatus) {
    PYX_NEED_SHARED_DIAG();
    const std::string file = "mi-unittest-cmcc.mi2log";
    const Dict searching = decodeOne(kMm, capturedPacket(file, kMm, 1, "130200"),
                                     id::K_CELLULAR_MM_CTXT);  // IDLE, PLMN_SEARCH, UPDATED
    EXPECT_EQ(text(searching, "reg_status"), "KREG_STATUS_REGISTRATION_IN_PROGRESS");
    EXPECT_EQ(text(searching, "update_status"), "STATUS_UPDATED");
    const Dict normal = decodeOne(kMm, capturedPacket(file, kMm, 9, "130800"),
                                  id::K_CELLULAR_MM_CTXT);  // IDLE, NORMAL_SERVICE
    EXPECT_EQ(text(normal, "reg_status"), "KREG_STATUS_NORMAL_SERVICE");
    const Dict connecting = decodeOne(kMm, capturedPacket(file, kMm, 11, "0d0800"),
                                      id::K_CELLULAR_MM_CTXT);  // waiting for RR, NORMAL
    EXPECT_EQ(text(connecting, "reg_status"), "KREG_STATUS_NORMAL_SERVICE");
    const Dict null = decodeOne(kMm, capturedPacket(file, kMm, 5, "000100"),
                                id::K_CELLULAR_MM_CTXT);  // MM NULL
    EXPECT_FALSE(null.contains("reg_status"));
    EXPECT_EQ(text(null, "update_status"), "STATUS_UPDATED");
}

TEST(NasDecoders, EveryPrefixOfAPacketIsRefusedAndLeavesTheStateAlone) {
    const std::array<std::pair<std::uint16_t, std::string>, 4> packets{{
        {kEmm, "020300001301840106130184e6fae9876821d7"},
        {kEsm, "0101070102ffff01060005012929292900000000"},
        {kGmm, "030000"},
        {kMm, "130800"},
    }};
    for (const auto& [code, hex] : packets) {
        const Bytes whole = fromHex(hex);
        for (std::size_t n = 0; n < whole.size(); ++n) {
            const Bytes prefix(whole.begin(), whole.begin() + static_cast<std::ptrdiff_t>(n));
            DecodeState state;
            state.nas.activeBearers = 1U << 5;
            EXPECT_FALSE(decode(nasDecoders(), code, prefix, state).decoded) << hex << " " << n;
            EXPECT_EQ(state.nas.activeBearers, 1U << 5);
        }
        DecodeState state;
        EXPECT_TRUE(decode(nasDecoders(), code, whole, state).decoded) << hex;
    }
}

TEST(NasDecoders, UnknownVersionsAndStatesAreRefused) {
    DecodeState state;
    // EMM state version 1 and ESM state version 2: no row.
    EXPECT_FALSE(
        decode(nasDecoders(), kEmm, fromHex("010300001301840106130184e6fae9876821d7"), state)
            .decoded);
    EXPECT_FALSE(
        decode(nasDecoders(), kEsm, fromHex("0200050200ffff000b0400000000000000000000"), state)
            .decoded);
    // A bearer state the captures never show, and an active bearer without an identity.
    EXPECT_FALSE(
        decode(nasDecoders(), kEsm, fromHex("0100050400ffff000b0400000000000000000000"), state)
            .decoded);
    EXPECT_FALSE(
        decode(nasDecoders(), kEsm, fromHex("0100030200ffff000b0400000000000000000000"), state)
            .decoded);
    EXPECT_EQ(state.nas.activeBearers, 0U);
    // A deactivation names its bearer: it leaves.
    ASSERT_TRUE(
        decode(nasDecoders(), kEsm, fromHex("0100050200ffff000b0400000000000000000000"), state)
            .decoded);
    ASSERT_TRUE(
        decode(nasDecoders(), kEsm, fromHex("0100050000ffff000b0400000000000000000000"), state)
            .decoded);
    EXPECT_EQ(state.nas.activeBearers, 0U);
}

// The vectors of the NAS range that no row of ours takes, and why.
struct Unused {
    const char* id;
    const char* why;
};
constexpr Unused kUnusedVectors[] = {
    {"v070", "0xB80C 5GMM state: 5G NR is counted, not decoded (no NR screen)"},
    {"v071", "0xB80C 5GMM state: 5G NR is counted, not decoded (no NR screen)"},
    {"v128",
     "0xB0E2 ESM plain message (fuzz regression): the NAS messages are counted, not "
     "decoded; the bearer list comes from 0xB0E5"},
};

TEST(NasVectors, NoVectorIsOursAndEachSaysWhy) {
    PYX_NEED_SHARED_DIAG();
    for (const Unused& unused : kUnusedVectors) {
        const Vector& v = vector(unused.id);
        const auto code = static_cast<std::uint16_t>(std::stoi(v.logCode, nullptr, 16));
        EXPECT_EQ(rowFor(nasDecoders(), code, v.bytes), nullptr) << unused.id << ": " << unused.why;
    }
    for (const Vector& v : vectors())
        for (const std::uint16_t code : kNasCodes)
            EXPECT_NE(v.logCode,
                      (std::ostringstream() << "0x" << std::uppercase << std::hex << code).str())
                << v.id;
}

TEST(NasScreens, LteNasActiveBearersAndUmtsNasShowTheCapturesValues) {
    PYX_NEED_SHARED_DIAG();
    const auto store = MetricValidator::create(nullptr);
    DecodeState state;
    const auto run = [&](const std::string& file, std::uint16_t code, std::size_t index) {
        const auto payloads = capturePayloads(file, code);
        ASSERT_LT(index, payloads.size());
        const Decoded d = decode(nasDecoders(), code, payloads[index], state);
        ASSERT_TRUE(d.decoded);
        feed(store, d.events);
    };
    run("mi-attach_sample.mi2log", kEmm, 7);
    for (std::size_t i = 0; i < 3; ++i) run("mi-volte_sample.mi2log", kEsm, i);
    run("mi-unittest-cmcc.mi2log", kGmm, 13);
    run("mi-unittest-cmcc.mi2log", kMm, 9);
    const auto shown = [&](const std::string& group, const std::string& category,
                           const std::string& key, int section = 0) {
        return pyx::test::shownOn(store, group, category, key, section);
    };
    EXPECT_EQ(shown("LTE", "NAS", "reg_status"), "KREG_STATUS_NORMAL_SERVICE");
    EXPECT_EQ(shown("LTE", "NAS", "reg_proc"), "EMM_PROC_NO_PROC");
    EXPECT_NE(shown("LTE", "NAS", "guti").value_or("").find("3609290887"), std::string::npos);
    ASSERT_EQ(pyx::test::sectionsOn(store, "LTE", "Active Bearers"), 3);
    EXPECT_EQ(shown("LTE", "Active Bearers", "nsapi", 0), "5");
    EXPECT_EQ(shown("LTE", "Active Bearers", "nsapi", 2), "7");
    EXPECT_EQ(shown("UMTS", "NAS GMM", "reg_status"), "KREG_STATUS_NORMAL_SERVICE");
    EXPECT_EQ(shown("UMTS", "NAS GMM", "update_status"), "GPRS_STATUS_UPDATED");
    EXPECT_EQ(shown("GSM", "NAS MM", "reg_status"), "KREG_STATUS_NORMAL_SERVICE");
    EXPECT_EQ(shown("UMTS", "NAS MM", "update_status"), "STATUS_UPDATED");
}

TEST(NasDecoders, NoisePayloadsNeverReadPastTheirEndAndWhatIsWrittenDecodes) {
    EXPECT_GT(feedNoise(nasDecoders()), 0U);
}

}  // namespace
}  // namespace pyx::diag::test
