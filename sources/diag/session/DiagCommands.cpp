#include "sources/diag/session/DiagCommands.h"

#include <algorithm>

namespace pyx::diag {

namespace {

void putU32(Bytes& out, std::uint32_t value) {
    for (int shift = 0; shift < 32; shift += 8)
        out.push_back(static_cast<std::uint8_t>(value >> shift));
}

std::optional<std::uint32_t> u32At(std::span<const std::uint8_t> bytes, std::size_t offset) {
    if (bytes.size() < offset + 4) return std::nullopt;
    std::uint32_t value = 0;
    for (std::size_t i = 0; i < 4; ++i)
        value |= static_cast<std::uint32_t>(bytes[offset + i]) << (8 * i);
    return value;
}

// Printable text of bytes [offset, offset + size) up to a NUL, trimmed of spaces at its ends.
std::string textAt(std::span<const std::uint8_t> bytes, std::size_t offset, std::size_t size) {
    std::string text;
    for (std::size_t i = offset; i < std::min(bytes.size(), offset + size); ++i) {
        if (bytes[i] == 0) break;
        text += (bytes[i] >= 0x20 && bytes[i] < 0x7F) ? static_cast<char>(bytes[i]) : '?';
    }
    const auto first = text.find_first_not_of(' ');
    if (first == std::string::npos) return {};
    return text.substr(first, text.find_last_not_of(' ') - first + 1);
}

std::string hexCode(unsigned value, int digits) {
    static constexpr char kDigits[] = "0123456789ABCDEF";
    std::string text = "0x";
    for (int i = digits - 1; i >= 0; --i) text += kDigits[(value >> (4 * i)) & 0xF];
    return text;
}

}  // namespace

Bytes versionRequest() {
    return {kVersionCommand};
}

Bytes buildIdRequest() {
    return {kBuildIdCommand};
}

Bytes eventReportRequest(bool on) {
    return {kEventReportCommand, static_cast<std::uint8_t>(on ? 1 : 0)};
}

Bytes logConfigRequest(std::uint32_t operation) {
    Bytes out;
    putU32(out, kLogConfigCommand);
    putU32(out, operation);
    return out;
}

Bytes setMaskRequest(const EquipmentMask& mask) {
    Bytes out = logConfigRequest(kLogConfigSetMask);
    putU32(out, mask.equipmentId);
    putU32(out, mask.items);
    out.insert(out.end(), mask.mask.begin(), mask.mask.end());
    return out;
}

std::optional<std::uint8_t> errorReply(std::span<const std::uint8_t> reply) {
    if (reply.empty() || reply[0] < 0x13 || reply[0] > 0x15) return std::nullopt;
    return reply[0];
}

bool answers(std::span<const std::uint8_t> request, std::span<const std::uint8_t> reply) {
    if (request.empty() || reply.empty()) return false;
    if (errorReply(reply)) return reply.size() >= 2 && reply[1] == request[0];
    if (reply[0] != request[0]) return false;
    if (request[0] != kLogConfigCommand) return true;
    const auto operation = u32At(request, 4);
    if (u32At(reply, 4) != operation) return false;
    // A SET_MASK reply echoes the equipment id after the status.
    return operation != kLogConfigSetMask || u32At(reply, 12) == u32At(request, 8);
}

std::optional<std::uint32_t> logConfigStatus(std::span<const std::uint8_t> reply) {
    return u32At(reply, 8);
}

std::optional<LogRanges> logRanges(std::span<const std::uint8_t> reply) {
    LogRanges ranges{};
    for (std::size_t id = 0; id < kEquipmentIds; ++id) {
        const auto items = u32At(reply, 12 + 4 * id);
        if (!items) return std::nullopt;
        ranges[id] = *items;
    }
    return ranges;
}

LogMaskPlan planLogMasks(std::span<const std::uint16_t> codes, const LogRanges& ranges) {
    LogMaskPlan plan;
    for (std::uint32_t id = 0; id < kEquipmentIds; ++id) {
        if (ranges[id] == 0) continue;
        plan.masks.push_back(
            {.equipmentId = id, .items = ranges[id], .mask = Bytes((ranges[id] + 7) / 8, 0)});
    }
    for (const std::uint16_t code : codes) {
        const std::uint32_t id = code >> 12;
        const std::uint32_t item = code & 0xFFF;
        const auto mask =
            std::find_if(plan.masks.begin(), plan.masks.end(),
                         [id](const EquipmentMask& m) { return m.equipmentId == id; });
        if (mask == plan.masks.end() || item >= mask->items) {
            plan.leftOut.push_back(code);
            continue;
        }
        mask->mask[item / 8] |= static_cast<std::uint8_t>(1U << (item % 8));
    }
    return plan;
}

void readVersion(std::span<const std::uint8_t> reply, ModemIdentity& identity) {
    // 0x00, compile date (11) and time (8), release date (11) and time (8), version folder (8).
    const std::string date = textAt(reply, 1, 11);
    const std::string time = textAt(reply, 12, 8);
    identity.compiled = time.empty() ? date : date + " " + time;
    identity.chipset = textAt(reply, 39, 8);
}

void readBuildId(std::span<const std::uint8_t> reply, ModemIdentity& identity) {
    // 0x7C, version u8, reserved u16, MSM hardware version u32, model id u32, then the build
    // id as a NUL-ended string.
    if (reply.size() > 12) identity.buildId = textAt(reply, 12, reply.size() - 12);
}

std::string ModemIdentity::describe() const {
    std::string text = chipset.empty() ? "version not given" : chipset;
    if (!compiled.empty()) text += " (compiled " + compiled + ")";
    text += buildId.empty() ? ", no build id" : ", build " + buildId;
    return text;
}

std::string codeList(std::span<const std::uint16_t> codes) {
    std::string text;
    for (const std::uint16_t code : codes) {
        if (!text.empty()) text += ", ";
        text += hexCode(code, 4);
    }
    return text;
}

}  // namespace pyx::diag
