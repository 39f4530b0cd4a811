// The start-up commands' requests, how replies are matched to them, and the log masks built
// from the decoders' codes and the modem's ranges.
#include <gtest/gtest.h>

#include <string>

#include "sources/diag/frame/Hdlc.h"
#include "sources/diag/session/DiagCommands.h"

namespace pyx::diag {
namespace {

Bytes hex(const std::string& text) {
    Bytes out;
    for (std::size_t i = 0; i + 1 < text.size(); i += 2)
        out.push_back(static_cast<std::uint8_t>(std::stoi(text.substr(i, 2), nullptr, 16)));
    return out;
}

TEST(DiagCommands, RequestsOnTheWire) {
    EXPECT_EQ(frame(versionRequest()), hex("0078f07e"));
    EXPECT_EQ(frame(buildIdRequest()), hex("7c93497e"));
    EXPECT_EQ(frame(eventReportRequest(false)), hex("6000126a7e"));
    EXPECT_EQ(frame(eventReportRequest(true)), hex("60019b7b7e"));
    EXPECT_EQ(frame(logConfigRequest(kLogConfigRetrieveRanges)), hex("7300000001000000619d7e"));
    EXPECT_EQ(frame(logConfigRequest(kLogConfigDisable)), hex("7300000000000000da817e"));
}

TEST(DiagCommands, SetMaskCarriesTheItemsOfEachCode) {
    LogRanges ranges{};
    ranges[0xB] = 0x209;
    ranges[0x4] = 100;
    const std::uint16_t codes[] = {0x4005, 0xB0C0, 0xB193, 0xB80C, 0x5134};
    const LogMaskPlan plan = planLogMasks(codes, ranges);
    ASSERT_EQ(plan.masks.size(), 2U);
    EXPECT_EQ(plan.masks[0].equipmentId, 4U);
    EXPECT_EQ(plan.masks[0].mask.size(), 13U);
    EXPECT_EQ(plan.masks[0].mask[0], 0x20);  // 0x4005: byte 0, bit 5
    const EquipmentMask& lte = plan.masks[1];
    EXPECT_EQ(lte.equipmentId, 0xBU);
    EXPECT_EQ(lte.items, 0x209U);
    ASSERT_EQ(lte.mask.size(), 66U);
    EXPECT_EQ(lte.mask[24], 0x01);  // 0xB0C0
    EXPECT_EQ(lte.mask[50], 0x08);  // 0xB193
    // 0xB80C is beyond the 0x209 items of equipment id 0xB, 0x5134's id has none.
    EXPECT_EQ(plan.leftOut, (std::vector<std::uint16_t>{0xB80C, 0x5134}));
    EXPECT_EQ(codeList(plan.leftOut), "0xB80C, 0x5134");

    const Bytes request = setMaskRequest(plan.masks[0]);
    EXPECT_EQ(Bytes(request.begin(), request.begin() + 16),
              hex("73000000030000000400000064000000"));
    EXPECT_EQ(request.size(), 16U + 13U);
}

TEST(DiagCommands, RepliesAreMatchedByCommandOperationAndEquipmentId) {
    const Bytes version = versionRequest();
    const Bytes ranges = logConfigRequest(kLogConfigRetrieveRanges);
    const Bytes mask = setMaskRequest({.equipmentId = 0xB, .items = 8, .mask = {0x01}});
    EXPECT_TRUE(answers(version, hex("004e6f76")));
    EXPECT_FALSE(answers(version, hex("7c01")));
    EXPECT_FALSE(answers(ranges, hex("7300000003000000000000000b000000")));
    EXPECT_TRUE(answers(ranges, hex("730000000100000000000000")));
    EXPECT_TRUE(answers(mask, hex("7300000003000000000000000b0000000800000001")));
    EXPECT_FALSE(answers(mask, hex("730000000300000000000000040000000800000001")));
    // Error replies carry the request after their own command byte.
    EXPECT_TRUE(answers(mask, hex("1473000000")));
    EXPECT_TRUE(answers(version, hex("1300")));
    EXPECT_FALSE(answers(version, hex("137c")));
    EXPECT_EQ(errorReply(hex("1473")), 0x14);
    EXPECT_FALSE(errorReply(hex("7300")));
}

TEST(DiagCommands, RangesAndStatusFromReplies) {
    Bytes reply = hex("730000000100000000000000");
    for (std::uint32_t id = 0; id < 16; ++id)
        reply.insert(reply.end(), {static_cast<std::uint8_t>(id * 3), 0x01, 0, 0});
    const auto ranges = logRanges(reply);
    ASSERT_TRUE(ranges);
    EXPECT_EQ((*ranges)[0], 0x100U);
    EXPECT_EQ((*ranges)[0xB], 0x100U + 33U);
    EXPECT_EQ(logConfigStatus(reply), 0U);
    reply.pop_back();
    EXPECT_FALSE(logRanges(reply));
    EXPECT_EQ(logConfigStatus(hex("730000000300000002000000")), 2U);
    EXPECT_FALSE(logConfigStatus(hex("7300000003")));
}

TEST(DiagCommands, ModemIdentityFromVersionAndBuildId) {
    Bytes version = {0x00};
    for (const char* part : {"Nov  2 2021", "22:13:12", "Oct 12 2021", "02:00:00", "sdx55.cp"})
        version.insert(version.end(), part, part + std::char_traits<char>::length(part));
    Bytes build = hex("7c010000f20c00004e010000");
    const std::string id = "RM500QGLABR11A06M4G";
    build.insert(build.end(), id.begin(), id.end());
    build.push_back(0);
    ModemIdentity identity;
    readVersion(version, identity);
    readBuildId(build, identity);
    EXPECT_EQ(identity.describe(), "sdx55.cp (compiled Nov  2 2021 22:13:12), build " + id);
    EXPECT_EQ(ModemIdentity{}.describe(), "version not given, no build id");
}

}  // namespace
}  // namespace pyx::diag
