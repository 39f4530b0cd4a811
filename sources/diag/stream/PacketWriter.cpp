// The packets a modem writes, for the fake modem of the tests, the benchmarks and the fuzz seeds.
#include <stdexcept>
#include <string>

#include "sources/diag/stream/DiagStream.h"

namespace pyx::diag {

namespace {

void putU16(Bytes& out, std::uint16_t v) {
    out.push_back(static_cast<std::uint8_t>(v & 0xFF));
    out.push_back(static_cast<std::uint8_t>(v >> 8));
}

void putU32(Bytes& out, std::uint32_t v) {
    putU16(out, static_cast<std::uint16_t>(v & 0xFFFF));
    putU16(out, static_cast<std::uint16_t>(v >> 16));
}

void putU64(Bytes& out, std::uint64_t v) {
    putU32(out, static_cast<std::uint32_t>(v & 0xFFFFFFFF));
    putU32(out, static_cast<std::uint32_t>(v >> 32));
}

}  // namespace

Bytes logPacket(std::uint16_t code, std::uint64_t timestamp,
                std::span<const std::uint8_t> payload) {
    // Both lengths hold the bytes after the first one: 12 + payload.
    constexpr std::size_t kCounted = 12;
    if (payload.size() > 0xFFFF - kCounted)
        throw std::length_error("log packet payload of " + std::to_string(payload.size()) +
                                " bytes: at most 65523 fit its u16 length");
    const auto length = static_cast<std::uint16_t>(kCounted + payload.size());
    Bytes out;
    out.reserve(4 + length);
    out.push_back(0x10);
    out.push_back(0x00);
    putU16(out, length);
    putU16(out, length);
    putU16(out, code);
    putU64(out, timestamp);
    out.insert(out.end(), payload.begin(), payload.end());
    return out;
}

Bytes eventReport(std::span<const WrittenEvent> events) {
    Bytes body;
    for (const WrittenEvent& e : events) {
        if (e.id > 0x0FFF)
            throw std::out_of_range("event id " + std::to_string(e.id) + ": at most 4095");
        if (e.payload.size() > 0xFF)
            throw std::length_error("event " + std::to_string(e.id) + " payload of " +
                                    std::to_string(e.payload.size()) +
                                    " bytes: at most 255 fit its length byte");
        // b0-11 id, b13-14 payload: 0 none, 1 one byte, 2 two bytes, 3 length-prefixed;
        // b15 the truncated time.
        const unsigned payloadCode = e.payload.size() <= 2 ? e.payload.size() : 3;
        const auto word =
            static_cast<std::uint16_t>(e.id | payloadCode << 13 | (e.truncatedTime ? 0x8000U : 0U));
        putU16(body, word);
        if (e.truncatedTime)
            putU16(body, static_cast<std::uint16_t>(e.timestamp >> 16 & 0xFFFF));
        else
            putU64(body, e.timestamp);
        if (payloadCode == 3) body.push_back(static_cast<std::uint8_t>(e.payload.size()));
        body.insert(body.end(), e.payload.begin(), e.payload.end());
    }
    if (body.size() > 0xFFFF)
        throw std::length_error("event report of " + std::to_string(body.size()) +
                                " bytes: at most 65535 fit its u16 length");
    Bytes out;
    out.reserve(3 + body.size());
    out.push_back(0x60);
    putU16(out, static_cast<std::uint16_t>(body.size()));
    out.insert(out.end(), body.begin(), body.end());
    return out;
}

Bytes multiSim(std::uint32_t subscription, std::span<const std::uint8_t> inner) {
    Bytes out{0x98, 0x01, 0x00, 0x00};
    out.reserve(8 + inner.size());
    putU32(out, subscription);
    out.insert(out.end(), inner.begin(), inner.end());
    return out;
}

}  // namespace pyx::diag
