#include "sources/diag/frame/Hdlc.h"

#include <array>
#include <bit>
#include <cstring>

namespace pyx::diag {

namespace {

constexpr std::uint16_t kPolynomial = 0x8408;  // 0x1021 reflected

// Slicing by 8: table k gives the CRC of a byte followed by k zero bytes.
using CrcTables = std::array<std::array<std::uint16_t, 256>, 8>;

constexpr CrcTables makeCrcTables() {
    CrcTables t{};
    for (unsigned i = 0; i < 256; ++i) {
        auto crc = static_cast<std::uint16_t>(i);
        for (int bit = 0; bit < 8; ++bit)
            crc = static_cast<std::uint16_t>(crc & 1 ? (crc >> 1) ^ kPolynomial : crc >> 1);
        t[0][i] = crc;
    }
    for (std::size_t k = 1; k < t.size(); ++k)
        for (unsigned i = 0; i < 256; ++i)
            t[k][i] = static_cast<std::uint16_t>(t[k - 1][i] >> 8 ^ t[0][t[k - 1][i] & 0xFF]);
    return t;
}

constexpr CrcTables kCrcTables = makeCrcTables();

std::uint64_t loadLittleEndian64(const std::uint8_t* at) {
    if constexpr (std::endian::native == std::endian::little) {
        std::uint64_t v;
        std::memcpy(&v, at, sizeof v);
        return v;
    } else {
        std::uint64_t v = 0;
        for (int i = 7; i >= 0; --i) v = v << 8 | at[i];
        return v;
    }
}

void appendEscaped(std::uint8_t b, Bytes& out) {
    if (b == 0x7E || b == 0x7D) {
        out.push_back(0x7D);
        out.push_back(static_cast<std::uint8_t>(b ^ 0x20));
    } else {
        out.push_back(b);
    }
}

}  // namespace

std::uint16_t crc16x25(std::span<const std::uint8_t> bytes) {
    const auto& t = kCrcTables;
    std::uint16_t crc = 0xFFFF;
    const std::uint8_t* at = bytes.data();
    std::size_t left = bytes.size();
    for (; left >= 8; left -= 8, at += 8) {
        const std::uint64_t v = loadLittleEndian64(at) ^ crc;
        crc = static_cast<std::uint16_t>(
            t[7][v & 0xFF] ^ t[6][v >> 8 & 0xFF] ^ t[5][v >> 16 & 0xFF] ^ t[4][v >> 24 & 0xFF] ^
            t[3][v >> 32 & 0xFF] ^ t[2][v >> 40 & 0xFF] ^ t[1][v >> 48 & 0xFF] ^ t[0][v >> 56]);
    }
    for (; left > 0; --left, ++at)
        crc = static_cast<std::uint16_t>(crc >> 8 ^ t[0][(crc ^ *at) & 0xFF]);
    return static_cast<std::uint16_t>(~crc);
}

void appendFrame(std::span<const std::uint8_t> packet, Bytes& out) {
    out.reserve(out.size() + packet.size() + packet.size() / 16 + 6);
    for (const std::uint8_t b : packet) appendEscaped(b, out);
    const std::uint16_t crc = crc16x25(packet);
    appendEscaped(static_cast<std::uint8_t>(crc & 0xFF), out);
    appendEscaped(static_cast<std::uint8_t>(crc >> 8), out);
    out.push_back(0x7E);
}

Bytes frame(std::span<const std::uint8_t> packet) {
    Bytes out;
    appendFrame(packet, out);
    return out;
}

void Deframer::append(std::span<const std::uint8_t> segment) {
    if (overlong_ || segment.empty()) return;
    const std::uint8_t* at = segment.data();
    const std::uint8_t* const end = at + segment.size();
    if (escaped_) {
        pending_.push_back(static_cast<std::uint8_t>(*at++ ^ 0x20));
        escaped_ = false;
    }
    while (at != end) {
        const auto* escape = static_cast<const std::uint8_t*>(
            std::memchr(at, kEscape, static_cast<std::size_t>(end - at)));
        pending_.insert(pending_.end(), at, escape != nullptr ? escape : end);
        if (escape == nullptr) break;
        if (escape + 1 == end) {
            escaped_ = true;
            break;
        }
        pending_.push_back(static_cast<std::uint8_t>(escape[1] ^ 0x20));
        at = escape + 2;
    }
    if (pending_.size() > kMaxFrame) {
        overlong_ = true;
        pending_.clear();
    }
}

bool Deframer::endFrame() {
    // An escape right before the flag, or a frame too long to keep, breaks the frame.
    const bool broken = escaped_ || overlong_;
    escaped_ = false;
    overlong_ = false;
    if (broken) {
        ++counts_.badFrames;
        pending_.clear();
        return false;
    }
    const auto packet = checkFrame(pending_);
    if (!packet) return false;
    pending_.resize(packet->size());
    return true;
}

std::optional<std::span<const std::uint8_t>> Deframer::checkFrame(
    std::span<const std::uint8_t> frame) {
    if (frame.empty()) {
        ++counts_.empty;
        return std::nullopt;
    }
    // At least a command byte and the CRC.
    if (frame.size() <= 2 || frame.size() > kMaxFrame) {
        ++counts_.badFrames;
        return std::nullopt;
    }
    const std::span<const std::uint8_t> packet = frame.first(frame.size() - 2);
    const auto crc = static_cast<std::uint16_t>(frame[frame.size() - 2] | frame.back() << 8);
    if (crc16x25(packet) != crc) {
        ++counts_.badFrames;
        return std::nullopt;
    }
    ++counts_.frames;
    return packet;
}

}  // namespace pyx::diag
