// The twelve captures of ../shared/diag/captures through the stream: the frames, bad frames,
// multi-SIM frames, log packets by code and version, commands and times it counts are those
// the captures' inventory lists.
#include <gtest/gtest.h>

#include <chrono>
#include <cstdio>
#include <fstream>
#include <iterator>
#include <nlohmann/json.hpp>
#include <set>
#include <string>

#include "sources/diag/stream/DiagStream.h"
#include "tests/sources/diag/support/DiagVectors.h"

namespace pyx::diag::test {
namespace {

Bytes readCapture(const std::string& file) {
    std::ifstream in(sharedDiag() / "captures" / file, std::ios::binary);
    return Bytes{std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

// "2020-05-08T17:24:43.469662" (UTC) as ms since 1970.
std::uint64_t isoMs(const std::string& text) {
    int year = 0;
    unsigned month = 0, day = 0, hour = 0, minute = 0;
    double second = 0;
    EXPECT_EQ(std::sscanf(text.c_str(), "%d-%u-%uT%u:%u:%lf", &year, &month, &day, &hour, &minute,
                          &second),
              6)
        << text;
    using namespace std::chrono;
    const sys_days date =
        year_month_day{std::chrono::year{year}, std::chrono::month{month}, std::chrono::day{day}};
    const auto ms = duration_cast<milliseconds>(date.time_since_epoch()).count() +
                    (hour * 60 + minute) * 60000LL + static_cast<long long>(second * 1000);
    return static_cast<std::uint64_t>(ms);
}

std::uint64_t distance(std::uint64_t a, std::uint64_t b) {
    return a > b ? a - b : b - a;
}

TEST(Captures, EveryCaptureDeframesAndCountsAsItsInventorySays) {
    PYX_NEED_SHARED_DIAG();
    std::ifstream in(sharedDiag() / "captures" / "inventory.json");
    const auto inventory = nlohmann::json::parse(in);
    ASSERT_EQ(inventory.size(), 12U);
    for (const auto& entry : inventory) {
        const std::string file = entry["file"].get<std::string>();
        SCOPED_TRACE(file);
        const Bytes raw = readCapture(file);
        ASSERT_EQ(raw.size(), entry["bytes"].get<std::size_t>());

        DiagStream diag;
        std::size_t decodedPackets = 0;
        diag.feed(raw, [&](DecodedPacket&) { ++decodedPackets; });
        diag.finish();
        const StreamStats& stats = diag.stats();

        const auto frames = entry["hdlc_frames"].get<std::uint64_t>();
        const auto good = entry["crc_ok"].get<std::uint64_t>();
        EXPECT_EQ(stats.frames.frames, good);
        EXPECT_EQ(stats.frames.badFrames, frames - good);
        EXPECT_LE(stats.frames.empty, 1U);  // a leading flag (offline_log_example)
        EXPECT_EQ(stats.frames.bytes, raw.size());
        EXPECT_EQ(stats.cutShort, 0U);
        EXPECT_EQ(stats.malformed, 0U);

        // Multi-SIM frames: all of them counted by subscription; the first subscription's
        // packets are the ones decoded, the others' are counted there only.
        std::uint64_t wrapped = 0, others = 0;
        for (const auto& [subscription, count] : stats.subscriptions) {
            wrapped += count;
            if (subscription != stats.subscriptions.begin()->first) others += count;
        }
        EXPECT_EQ(wrapped, entry["wrapped_0x98"].get<std::uint64_t>());

        // Log packets by code and version ("0xB0C0/v15"), or by code alone for codes whose
        // payload starts with no version byte ("0x7130"): those are summed over payload[0].
        std::map<std::pair<std::uint16_t, int>, std::uint64_t> expected, seen;
        std::uint64_t expectedLogs = 0;
        std::set<std::uint16_t> byCodeAlone;
        for (const auto& [key, count] : entry["log_codes"].items()) {
            unsigned code = 0;
            int version = kAnyVersion;
            ASSERT_GE(std::sscanf(key.c_str(), "0x%x/v%d", &code, &version), 1) << key;
            if (version == kAnyVersion) byCodeAlone.insert(static_cast<std::uint16_t>(code));
            expected[{static_cast<std::uint16_t>(code), version}] = count.get<std::uint64_t>();
            expectedLogs += count.get<std::uint64_t>();
        }
        std::uint64_t logs = 0, decoded = 0;
        for (const auto& [key, counts] : stats.logs) {
            const int version = byCodeAlone.contains(key.first) ? kAnyVersion : key.second;
            seen[{key.first, version}] += counts.decoded + counts.notDecoded;
            logs += counts.decoded + counts.notDecoded;
            decoded += counts.decoded;
        }
        if (others == 0) {
            EXPECT_EQ(seen, expected);
        } else {
            // Only the first subscription's log packets are counted by code.
            for (const auto& [key, count] : seen) EXPECT_LE(count, expected[key]);
            EXPECT_EQ(seen.size(), expected.size());
        }
        EXPECT_EQ(logs + others, expectedLogs);
        EXPECT_LE(decodedPackets, decoded);

        // Other commands: everything but log packets, multi-SIM frames and event reports.
        for (const auto& [key, count] : entry["cmds"].items()) {
            const auto command = static_cast<std::uint8_t>(std::stoul(key, nullptr, 16));
            if (command == 0x10 || command == 0x98 || command == 0x60) continue;
            const auto it = stats.otherCommands.find(command);
            EXPECT_EQ(it == stats.otherCommands.end() ? 0 : it->second, count.get<std::uint64_t>())
                << key;
        }

        // The modem's times (ours to the ms, the inventory's with the fraction of a tick).
        ASSERT_TRUE(stats.firstTimeMs.has_value());
        ASSERT_TRUE(stats.lastTimeMs.has_value());
        EXPECT_LE(distance(*stats.firstTimeMs, isoMs(entry["first_ts"].get<std::string>())), 2U);
        EXPECT_LE(distance(*stats.lastTimeMs, isoMs(entry["last_ts"].get<std::string>())), 2U);
    }
}

TEST(Captures, TheDecodersTakeTheirCodesInTheCaptures) {
    PYX_NEED_SHARED_DIAG();
    // attach_sample: LTE NAS EMM state (0xB0EE v2) and ESM bearers (0xB0E5 v1).
    struct Expect {
        const char* file;
        std::uint16_t code;
        int version;
    };
    for (const Expect& e : {Expect{"mi-attach_sample.mi2log", 0xB0EE, 2},
                            Expect{"mi-attach_sample.mi2log", 0xB0E5, 1}}) {
        DiagStream diag;
        std::size_t packets = 0;
        diag.feed(readCapture(e.file), [&](DecodedPacket& p) {
            ++packets;
            EXPECT_FALSE(p.events.empty());
            EXPECT_NE(p.modemTimeMs, 0U);
        });
        const auto it = diag.stats().logs.find({e.code, e.version});
        ASSERT_NE(it, diag.stats().logs.end()) << e.file << " " << e.code;
        EXPECT_GT(it->second.decoded, 0U) << e.file << " " << e.code;
        EXPECT_GT(packets, 0U);
    }
}

}  // namespace
}  // namespace pyx::diag::test
