// The DIAG commands the live session sends, and what their replies say. Requests are packets
// (unframed); replies are packets as the stream hands them over (unescaped, CRC removed).
// LOG_CONFIG (0x73) fields are little-endian u32: command, operation, then the operation's own.
#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "core/Value.h"

namespace pyx::diag {

inline constexpr std::uint8_t kVersionCommand = 0x00;
inline constexpr std::uint8_t kBuildIdCommand = 0x7C;
inline constexpr std::uint8_t kEventReportCommand = 0x60;
inline constexpr std::uint8_t kLogConfigCommand = 0x73;
inline constexpr std::uint32_t kLogConfigDisable = 0;
inline constexpr std::uint32_t kLogConfigRetrieveRanges = 1;
inline constexpr std::uint32_t kLogConfigSetMask = 3;
inline constexpr std::size_t kEquipmentIds = 16;

// The log items each equipment id (the top nibble of a log code) has on this modem.
using LogRanges = std::array<std::uint32_t, kEquipmentIds>;

// One SET_MASK: the bits of items (code & 0xFFF) on, least significant bit first.
struct EquipmentMask {
    std::uint32_t equipmentId = 0;
    std::uint32_t items = 0;
    Bytes mask;  // (items + 7) / 8 bytes
};

[[nodiscard]] Bytes versionRequest();
[[nodiscard]] Bytes buildIdRequest();
[[nodiscard]] Bytes eventReportRequest(bool on);
[[nodiscard]] Bytes logConfigRequest(std::uint32_t operation);  // disable, retrieve ranges
[[nodiscard]] Bytes setMaskRequest(const EquipmentMask& mask);

// Whether reply answers request: the same command (for LOG_CONFIG the same operation, and for
// SET_MASK the same equipment id), or an error reply (0x13 bad command, 0x14 bad parameter,
// 0x15 bad length) that carries the request's command.
[[nodiscard]] bool answers(std::span<const std::uint8_t> request,
                           std::span<const std::uint8_t> reply);
// The error reply's command byte (0x13, 0x14, 0x15), or none for a real reply.
[[nodiscard]] std::optional<std::uint8_t> errorReply(std::span<const std::uint8_t> reply);
// A LOG_CONFIG reply's status word (0: done), or none when too short for one.
[[nodiscard]] std::optional<std::uint32_t> logConfigStatus(std::span<const std::uint8_t> reply);
// RETRIEVE_ID_RANGES' item counts, or none when the reply is too short.
[[nodiscard]] std::optional<LogRanges> logRanges(std::span<const std::uint8_t> reply);

// The masks for codes on this modem: one per equipment id the modem has items for (an id
// with none of codes gets an empty mask, so that no other logging stays on), and the codes
// left out because the modem's range for their equipment id does not reach them.
struct LogMaskPlan {
    std::vector<EquipmentMask> masks;
    std::vector<std::uint16_t> leftOut;
};
[[nodiscard]] LogMaskPlan planLogMasks(std::span<const std::uint16_t> codes,
                                       const LogRanges& ranges);

// What the version (0x00) and extended build id (0x7C) replies say of the modem.
struct ModemIdentity {
    std::string chipset;   // the version folder: "sdx55.cp"
    std::string compiled;  // "Nov  2 2021 22:13:12"
    std::string buildId;   // "RM500QGLABR11A06M4G"
    // "sdx55.cp (compiled Nov  2 2021 22:13:12), build RM500QGLABR11A06M4G"
    [[nodiscard]] std::string describe() const;
};
void readVersion(std::span<const std::uint8_t> reply, ModemIdentity& identity);
void readBuildId(std::span<const std::uint8_t> reply, ModemIdentity& identity);

// "0x4127, 0xB80C"
[[nodiscard]] std::string codeList(std::span<const std::uint16_t> codes);

}  // namespace pyx::diag
