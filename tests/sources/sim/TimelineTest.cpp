#include "sources/sim/Timeline.h"

#include <gtest/gtest.h>

#include <map>
#include <set>
#include <vector>

#include "tests/sources/sim/Decoders.h"
#include "tests/sources/sim/SimEvents.h"

namespace {

using pyx::Dict;
using pyx::Value;
using pyx::sim::DeviceConfig;
using pyx::sim::MetricQuery;
using pyx::sim::SimEvent;
using pyx::sim::Timeline;
using pyx::testing::isMetric;
using pyx::testing::isTrigger;
using pyx::testing::metricIDOf;
using pyx::testing::payloadOf;
using pyx::testing::storedKinds;

constexpr std::uint64_t kStart = 1'700'000'000'000ULL;  // 2023-11-14 22:13:20 UTC

std::vector<SimEvent> run(Timeline& timeline, int steps) {
    std::vector<SimEvent> all;
    for (int i = 0; i < steps; ++i) {
        auto events = timeline.step();
        all.insert(all.end(), events.begin(), events.end());
    }
    return all;
}

Timeline configured(std::uint64_t seed) {
    Timeline timeline(seed, kStart);
    timeline.configure(pyx::testing::shippedConfiguration());
    return timeline;
}

// The decoded dictionaries of every metric event, by metric ID, in order.
std::map<std::int64_t, std::vector<Dict>> decodedByKind(const std::vector<SimEvent>& events) {
    std::map<std::int64_t, std::vector<Dict>> out;
    for (const auto& e : events) {
        if (!isMetric(e)) continue;
        const auto kind = storedKinds().find(metricIDOf(e.object));
        if (kind == storedKinds().end()) continue;
        const auto decoded = kind->second(payloadOf(e.object));
        if (decoded) out[kind->first].push_back(decoded->dictionary);
    }
    return out;
}

TEST(SimTimeline, TheSameSeedGivesTheSameEvents) {
    Timeline a = configured(5);
    Timeline b = configured(5);
    const auto first = run(a, 600);
    const auto second = run(b, 600);
    ASSERT_FALSE(first.empty());
    EXPECT_EQ(first, second);
}

TEST(SimTimeline, DifferentSeedsGiveDifferentDrives) {
    Timeline a = configured(5);
    Timeline b = configured(6);
    EXPECT_NE(run(a, 100), run(b, 100));
}

TEST(SimTimeline, NothingIsEmittedBeforeAConfigurationIsAccepted) {
    Timeline timeline(1, kStart);
    EXPECT_TRUE(run(timeline, 100).empty());
    EXPECT_FALSE(timeline.configured());
}

TEST(SimTimeline, EveryConfiguredItemIsDueAtTheFirstStepThenOncePerPeriod) {
    Timeline timeline(1, kStart);
    timeline.configure(pyx::sim::parseDeviceConfig(
        "metric 0x3C4E04 every 1s\nmetric 0x3C0013 every 500ms\ntrigger 0x7F0001 every 2s\n"));
    const auto firstStep = timeline.step();
    ASSERT_EQ(firstStep.size(), 3U);
    EXPECT_TRUE(isTrigger(firstStep[0]));
    EXPECT_EQ(metricIDOf(firstStep[1].object), 0x3C4E04);
    EXPECT_EQ(metricIDOf(firstStep[2].object), 0x3C0013);
    // Two more simulated seconds: 2 RRC states, 4 SIM file reports, 1 trigger.
    const auto later = run(timeline, 20);
    std::map<std::int64_t, int> metrics;
    int triggers = 0;
    for (const auto& e : later) {
        if (isTrigger(e))
            ++triggers;
        else
            ++metrics[metricIDOf(e.object)];
    }
    EXPECT_EQ(metrics[0x3C4E04], 2);
    EXPECT_EQ(metrics[0x3C0013], 4);
    EXPECT_EQ(triggers, 1);
}

TEST(SimTimeline, MetricEventsCarryTheirIDPayloadAndZeroTypeAndProfile) {
    Timeline timeline = configured(1);
    const auto events = timeline.step();
    ASSERT_FALSE(events.empty());
    for (const auto& e : events) {
        if (!isMetric(e)) continue;
        const Dict& d = e.object.asDict();
        ASSERT_EQ(d.size(), 4U);
        EXPECT_EQ(d.at(0).key, velk::kKeyMetricID);
        EXPECT_TRUE(d.at(0).value.isInt());
        EXPECT_EQ(d.at(1).key, velk::kKeyPayload);
        EXPECT_TRUE(d.at(1).value.isBytes());
        EXPECT_EQ(d.at(2), (pyx::DictEntry{velk::kKeyPayloadType, Value(std::int64_t{0})}));
        EXPECT_EQ(d.at(3), (pyx::DictEntry{velk::kKeyProfileID, Value(std::int64_t{0})}));
    }
}

TEST(SimTimeline, ClearingTheConfigurationStopsTheMetrics) {
    Timeline timeline = configured(1);
    EXPECT_FALSE(run(timeline, 10).empty());
    timeline.clear();
    EXPECT_FALSE(timeline.configured());
    EXPECT_TRUE(run(timeline, 100).empty());
}

TEST(SimTimeline, TheSimFilesQueryIsAnsweredByATriggerEventThenTheSimFilesMetric) {
    Timeline timeline(1, kStart);
    MetricQuery query;
    query.triggerRef = 9999;
    query.triggerID = 0x7F0013;
    ASSERT_TRUE(timeline.query(query));
    const auto events = timeline.step();
    ASSERT_EQ(events.size(), 2U);
    EXPECT_TRUE(isTrigger(events[0]));
    EXPECT_EQ(events[0].object, Value(Dict{{velk::kKeyTriggerID, Value(std::int64_t{0x7F0013})},
                                           {velk::kKeyTriggerRef, Value(std::int64_t{9999})},
                                           {velk::kKeyTriggerType, Value(std::int64_t{0})},
                                           {velk::kKeyProfileID, Value(std::int64_t{0})}}));
    ASSERT_TRUE(isMetric(events[1]));
    EXPECT_EQ(metricIDOf(events[1].object), 3932179);
    EXPECT_TRUE(storedKinds().at(3932179)(payloadOf(events[1].object)).has_value());
    EXPECT_TRUE(run(timeline, 10).empty());
}

TEST(SimTimeline, AQueryForAReportedMetricIsAnsweredWithThatMetric) {
    Timeline timeline(1, kStart);
    MetricQuery query;
    query.triggerID = 0x7F0001;
    query.metricID = 0x3C4E04;
    ASSERT_TRUE(timeline.query(query));
    const auto events = timeline.step();
    ASSERT_EQ(events.size(), 2U);
    EXPECT_EQ(metricIDOf(events[1].object), 0x3C4E04);
}

TEST(SimTimeline, AQueryForAMetricItDoesNotReportIsRefused) {
    Timeline timeline(1, kStart);
    MetricQuery query;
    query.triggerID = 0x7F0001;
    query.metricID = 0x123456;
    EXPECT_FALSE(timeline.query(query));
    query.triggerID = 0x7F0002;  // metric ID 0 only means the SIM files with their trigger
    query.metricID = 0;
    EXPECT_FALSE(timeline.query(query));
    EXPECT_TRUE(timeline.step().empty());
}

TEST(SimTimeline, TimestampsFollowSimulatedTime) {
    Timeline timeline(1, kStart);
    timeline.configure(pyx::sim::parseDeviceConfig("metric 0x3C4E04 every 1s\n"));
    const auto events = run(timeline, 31);
    std::vector<std::uint64_t> stamps;
    for (const auto& e : events) {
        const auto decoded = pyx::KCellularLteRrcState::initWithData(payloadOf(e.object));
        ASSERT_TRUE(decoded);
        ASSERT_TRUE(decoded->hasTimestamp());
        stamps.push_back(decoded->timestamp());
    }
    EXPECT_EQ(stamps, (std::vector<std::uint64_t>{kStart + 100, kStart + 1100, kStart + 2100,
                                                  kStart + 3100}));
    EXPECT_EQ(timeline.nowMs(), kStart + 3100);
}

TEST(SimTimeline, EveryStoredKindIsEmittedAndDecodedByItsClassWithinAFewSimulatedSeconds) {
    Timeline timeline = configured(3);
    const auto events = run(timeline, 30);  // three simulated seconds
    std::set<std::int64_t> seen;
    for (const auto& e : events) {
        if (!isMetric(e)) continue;
        const std::int64_t id = metricIDOf(e.object);
        const auto kind = storedKinds().find(id);
        if (kind == storedKinds().end()) continue;
        const auto decoded = kind->second(payloadOf(e.object));
        ASSERT_TRUE(decoded) << std::hex << id;
        EXPECT_TRUE(decoded->roundTrips) << std::hex << id;
        const Value* timestamp = decoded->dictionary.find("timestamp");
        ASSERT_NE(timestamp, nullptr) << std::hex << id;
        EXPECT_GT(timestamp->asUInt(), kStart) << std::hex << id;
        seen.insert(id);
    }
    EXPECT_EQ(seen.size(), 30U);
}

TEST(SimTimeline, TheTwoIgnoredKindsAreEmittedNowAndThen) {
    Timeline timeline = configured(3);
    const auto events = run(timeline, 600);  // one simulated minute
    int servingCellMeas = 0;
    int radioLinkFailures = 0;
    for (const auto& e : events) {
        if (!isMetric(e)) continue;
        const std::int64_t id = metricIDOf(e.object);
        if (id == pyx::testing::kServingCellMeasID) {
            ++servingCellMeas;
            EXPECT_TRUE(pyx::KCellularLteServingCellMeasurement::initWithData(payloadOf(e.object)));
        }
        if (id == pyx::testing::kRadioLinkFailureID) ++radioLinkFailures;
    }
    EXPECT_GE(servingCellMeas, 2);
    EXPECT_GE(radioLinkFailures, 2);
}

TEST(SimTimeline, TriggerEventsArriveWithIncreasingReferences) {
    Timeline timeline = configured(3);
    std::vector<std::int64_t> refs;
    for (const auto& e : run(timeline, 600))
        if (isTrigger(e)) refs.push_back(e.object.asDict().find(velk::kKeyTriggerRef)->asInt());
    ASSERT_GE(refs.size(), 3U);
    for (std::size_t i = 1; i < refs.size(); ++i) EXPECT_EQ(refs[i], refs[i - 1] + 1);
}

// ---- A plausible drive. ----

TEST(SimDrive, TheRrcStateGoesThroughIdleAndConnectedPhases) {
    Timeline timeline = configured(4);
    std::set<std::string> states;
    const auto decoded = decodedByKind(run(timeline, 3000));
    for (const auto& d : decoded.at(0x3C4E04))  // five minutes
        states.insert(d.find("state")->asString());
    EXPECT_TRUE(states.count("KLTE_RRC_STATE_IDLE"));
    EXPECT_TRUE(states.count("KLTE_RRC_STATE_CONNECTED"));
}

TEST(SimDrive, ServingCellMeasurementsDriftWithinPlausibleBounds) {
    Timeline timeline = configured(4);
    std::set<std::int64_t> rsrps;
    const auto decoded = decodedByKind(run(timeline, 1200));
    for (const auto& d : decoded.at(0x3C4F6A)) {
        for (const auto& inst : d.find("inst_values")->asArray()) {
            const Dict& v = inst.asDict();
            const std::int64_t rsrp = *v.find("rsrp0")->toInt64();
            const std::int64_t rsrq = *v.find("rsrq0")->toInt64();
            const std::int64_t sinr = *v.find("sinr0")->toInt64();
            EXPECT_GE(rsrp, -125);
            EXPECT_LE(rsrp, -65);
            EXPECT_GE(rsrq, -20);
            EXPECT_LE(rsrq, -3);
            EXPECT_GE(sinr, -12);  // half-dB steps
            EXPECT_LE(sinr, 62);
            rsrps.insert(rsrp);
        }
    }
    EXPECT_GT(rsrps.size(), 3U);
}

TEST(SimDrive, NeighboursComeAndGoAndUseRawIndexUnits) {
    Timeline timeline = configured(4);
    std::set<std::size_t> counts;
    const auto decoded = decodedByKind(run(timeline, 3000));
    for (const auto& d : decoded.at(0x3CD30F)) {
        const Value* list = d.find("meas_nbr_eutra");
        counts.insert(list ? list->asArray().size() : 0);
        if (!list) continue;
        for (const auto& n : list->asArray()) {
            const std::int64_t rsrp = *n.asDict().find("nbr_rsrp")->toInt64();
            const std::int64_t rsrq = *n.asDict().find("nbr_rsrq")->toInt64();
            EXPECT_GE(rsrp, 0);
            EXPECT_LE(rsrp, 97);
            EXPECT_GE(rsrq, 0);
            EXPECT_LE(rsrq, 34);
        }
    }
    EXPECT_GT(counts.size(), 1U);
}

TEST(SimDrive, SecondaryCarriersActivateAndDeactivateInHundredthsOfADb) {
    Timeline timeline = configured(4);
    std::set<std::string> states;
    const auto decoded = decodedByKind(run(timeline, 3000));
    for (const auto& d : decoded.at(0x3CD313)) {
        for (const auto& scc : d.find("scc_list")->asArray()) {
            states.insert(scc.asDict().find("state")->asString());
            const std::int64_t rsrp = *scc.asDict().find("rsrp")->toInt64();
            EXPECT_LE(rsrp, -7000);
            EXPECT_GE(rsrp, -14000);
            const std::int64_t bw = *scc.asDict().find("dl_bandwidth")->toInt64();
            EXPECT_LE(bw, 5);
        }
    }
    EXPECT_TRUE(states.count("SCC_STATE_ACTIVATED"));
    EXPECT_TRUE(states.count("SCC_STATE_DECONFIGURED"));
}

TEST(SimDrive, InterRatNeighboursUseOffsetIndexes) {
    Timeline timeline = configured(4);
    const auto decoded = decodedByKind(run(timeline, 100));
    const Dict& lte = decoded.at(0x3CD310).back();
    for (const auto& n : lte.find("meas_nbr_utra")->asArray()) {
        EXPECT_LE(*n.asDict().find("rscp")->toInt64(), 91);
        EXPECT_LE(*n.asDict().find("ecno")->toInt64(), 49);
    }
    for (const auto& n : lte.find("meas_nbr_geran")->asArray())
        EXPECT_LE(*n.asDict().find("rxlev")->toInt64(), 63);
    const Dict& umts = decoded.at(0x3CD105).back();
    EXPECT_TRUE(umts.contains("meas_utra_result"));
    EXPECT_TRUE(umts.contains("meas_gsm_result"));
    EXPECT_TRUE(umts.contains("meas_lte_result"));
    const Dict& gsm = decoded.at(0x3CD009).back();
    EXPECT_TRUE(gsm.contains("gsm_ncell_meas"));
    EXPECT_TRUE(gsm.contains("umts_ncell_meas"));
    EXPECT_TRUE(gsm.contains("lte_ncell_meas"));
}

TEST(SimDrive, TwoBearersCarryAnImsAndAnInternetApnWithTheirAddresses) {
    Timeline timeline = configured(4);
    const auto decoded = decodedByKind(run(timeline, 1));
    const Dict& bearers = decoded.at(0x3CD50D).front();
    EXPECT_EQ(*bearers.find("bearer_context_count"), Value(std::uint64_t{2}));
    const auto& list = bearers.find("bearer_contexts")->asArray();
    ASSERT_EQ(list.size(), 2U);
    const Dict& internet = list[0].asDict();
    const Dict& ims = list[1].asDict();
    EXPECT_EQ(internet.find("apn")->asString(), "internet");
    EXPECT_EQ(internet.find("pdp_type")->asString(), "PDP_TYPE_IPv4v6");
    EXPECT_EQ(internet.find("pdp_addr")->asBytes().size(), 20U);  // IPv4 and IPv6
    EXPECT_EQ(ims.find("apn")->asString(), "ims");
    EXPECT_EQ(ims.find("pdp_type")->asString(), "PDP_TYPE_IPv6");
    EXPECT_EQ(ims.find("pdp_addr")->asBytes().size(), 16U);
}

TEST(SimDrive, NasContextsCarryTheSubscribersIdentities) {
    Timeline timeline = configured(4);
    const auto decoded = decodedByKind(run(timeline, 1));
    const Dict& emm = decoded.at(0x3CD50C).front();
    EXPECT_EQ(emm.find("reg_status")->asString(), "KREG_STATUS_NORMAL_SERVICE");
    EXPECT_TRUE(emm.find("guti")->asDict().contains("m_tmsi"));
    EXPECT_TRUE(emm.contains("tai_list"));
    const Dict& common = decoded.at(0x3CD509).front();
    EXPECT_EQ(common.find("imsi")->asBytes().size(), 8U);
    EXPECT_EQ(common.find("eplmn_list")->asArray().front().asDict().find("encoded_plmn")->asBytes(),
              (pyx::Bytes{0x00, 0xF1, 0x10}));
    EXPECT_TRUE(decoded.at(0x3CD50A).front().contains("lai"));
    EXPECT_TRUE(decoded.at(0x3CD50B).front().contains("rai"));
}

TEST(SimDrive, TheSimFilesHoldIccidImsiSpnAndMore) {
    Timeline timeline = configured(4);
    const auto decoded = decodedByKind(run(timeline, 1));
    const Dict& sim = decoded.at(0x3C0013).front();
    std::map<std::uint64_t, pyx::Bytes> files;
    for (const auto& ef : sim.find("ef_list")->asArray())
        files[ef.asDict().find("ef_id")->asUInt()] = ef.asDict().find("content")->asBytes();
    ASSERT_TRUE(files.count(0x2FE2));
    EXPECT_EQ(files[0x2FE2].size(), 10U);
    EXPECT_EQ(files[0x2FE2][0], 0x98);  // "89..." swapped
    ASSERT_TRUE(files.count(0x6F07));
    EXPECT_EQ(files[0x6F07][0], 0x08);
    ASSERT_TRUE(files.count(0x6F46));
    EXPECT_EQ(std::string(files[0x6F46].begin() + 1, files[0x6F46].begin() + 11), "Pyxon Test");
    EXPECT_GE(files.size(), 6U);
}

}  // namespace
