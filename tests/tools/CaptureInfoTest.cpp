// pyxonctl info on a raw DIAG capture: what the stream held, per log code and version, as one
// JSON object; and on the peers' captures, the counts their inventory gives.
#include <gtest/gtest.h>

#include <fstream>
#include <nlohmann/json.hpp>
#include <sstream>
#include <string>
#include <vector>

#include "sources/diag/frame/Hdlc.h"
#include "sources/diag/stream/DiagStream.h"
#include "tests/recordings/TempDir.h"
#include "tests/sources/diag/support/DiagVectors.h"
#include "tests/sources/diag/transport/WcdmaCapture.h"
#include "tests/tools/InProcess.h"

namespace {

using Json = nlohmann::json;
using pyx::Bytes;
using pyx::testing::TempDir;
namespace dt = pyx::diag::test;

using pyx::test::info;
using pyx::test::Outcome;

Json logEntry(const Json& object, const std::string& code, int version) {
    for (const auto& entry : object["logs"])
        if (entry["code"] == code && entry["version"] == version) return entry;
    ADD_FAILURE() << "no " << code << " v" << version << " in " << object.dump();
    return Json::object();
}

// Two WCDMA cells (decoded), an unknown LTE code twice, a frame with a bad CRC, a multi-SIM
// frame of a second subscription after one of the first, and a last frame cut short.
Bytes mixedCapture() {
    const std::uint64_t start = 1700000000000ULL;
    const std::vector<dt::CapturedCell> cells{{start, 10663, 1}, {start + 1000, 10663, 2}};
    Bytes stream = dt::wcdmaCapture(cells);
    const Bytes unknown{0x01, 0x02, 0x03};
    for (int i = 0; i < 2; ++i)
        pyx::diag::appendFrame(
            pyx::diag::logPacket(0xB8AA, dt::logTimestamp(start + 2000), unknown), stream);
    Bytes bad = pyx::diag::frame(pyx::diag::logPacket(0xB8AA, 0, unknown));
    bad[3] ^= 0xFF;
    stream.insert(stream.end(), bad.begin(), bad.end());
    const Bytes inner = pyx::diag::logPacket(0x4127, dt::logTimestamp(start + 3000),
                                             dt::wcdmaCellPayload(cells[0]));
    pyx::diag::appendFrame(pyx::diag::multiSim(1, inner), stream);
    pyx::diag::appendFrame(pyx::diag::multiSim(2, inner), stream);
    const Bytes tail = pyx::diag::frame(inner);
    stream.insert(stream.end(), tail.begin(), tail.begin() + 10);
    return stream;
}

TEST(CaptureInfo, SaysPerCodeAndVersionWhatWasDecodedAndWhatWasNot) {
    const TempDir dir;
    const std::string file = dir.file("drive.qmdl");
    dt::writeBytes(file, mixedCapture());
    const Outcome run = info(file);
    ASSERT_EQ(run.status, 0) << run.err;
    EXPECT_EQ(run.err, "");
    const Json object = Json::parse(run.out);
    EXPECT_EQ(object["file"], file);
    EXPECT_EQ(object["kind"], "diag capture");
    EXPECT_EQ(object["bad_frames"], 1);
    EXPECT_EQ(object["cut_short_bytes"], 10);
    EXPECT_EQ(object["malformed"], 0);
    // The WCDMA cell ID has no version byte: its first payload byte is the UL UARFCN's.
    const Json cell = logEntry(object, "0x4127", dt::wcdmaCellPayload({}).front());
    EXPECT_EQ(cell["name"], "WCDMA cell ID");
    EXPECT_EQ(cell["decoded"], 3);  // two cells and the first subscription's
    EXPECT_EQ(cell["not_decoded"], 0);
    const Json unknown = logEntry(object, "0xB8AA", 1);
    EXPECT_TRUE(unknown["name"].is_null());
    EXPECT_EQ(unknown["decoded"], 0);
    EXPECT_EQ(unknown["not_decoded"], 2);
    EXPECT_EQ(object["subscriptions"], (Json{{"1", 1}, {"2", 1}}));
    EXPECT_EQ(object["first"], "2023-11-14T22:13:20.000000000Z");
    EXPECT_EQ(object["last"], "2023-11-14T22:13:23.000000000Z");
}

TEST(CaptureInfo, AFileWithoutAnyDiagFrameIsNeitherARecordingNorACapture) {
    const TempDir dir;
    const std::string file = dir.file("noise.bin");
    std::ofstream(file, std::ios::binary) << std::string(300, '\x7e') << "no frames here";
    const Outcome run = info(file);
    EXPECT_EQ(run.status, 1);
    EXPECT_EQ(run.out, "");
    EXPECT_EQ(run.err, "pyxonctl info: " + file +
                           ": not a Pyxon recording (not an SQLite database) nor a DIAG capture "
                           "(no DIAG frame in it)\n");
}

// The peers' captures: frames, bad frames and log counts as their inventory lists them.
TEST(CaptureInfo, ThePeersCapturesGiveTheirInventorysCounts) {
    PYX_NEED_SHARED_DIAG();
    std::ifstream in(dt::sharedDiag() / "captures" / "inventory.json");
    const Json inventory = Json::parse(in);
    for (const auto& entry : inventory) {
        const std::string file =
            (dt::sharedDiag() / "captures" / entry["file"].get<std::string>()).string();
        const Outcome run = info(file);
        ASSERT_EQ(run.status, 0) << file << ": " << run.err;
        const Json object = Json::parse(run.out);
        EXPECT_EQ(object["frames"], entry["crc_ok"]) << file;
        EXPECT_EQ(object["bad_frames"].get<int>(),
                  entry["hdlc_frames"].get<int>() - entry["crc_ok"].get<int>())
            << file;
        EXPECT_EQ(object["subscriptions"].size() > 0, entry["wrapped_0x98"].get<int>() > 0) << file;
    }
}

}  // namespace
