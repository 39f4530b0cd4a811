#include "tests/sources/diag/transport/WcdmaCapture.h"

#include <fstream>
#include <stdexcept>

#include "sources/diag/frame/Hdlc.h"
#include "sources/diag/stream/DiagStream.h"

namespace pyx::diag::test {
namespace {

void putU16(Bytes& out, std::size_t at, std::uint32_t value) {
    out[at] = static_cast<std::uint8_t>(value);
    out[at + 1] = static_cast<std::uint8_t>(value >> 8);
}

void putU32(Bytes& out, std::size_t at, std::uint32_t value) {
    putU16(out, at, value & 0xFFFFU);
    putU16(out, at + 2, value >> 16);
}

}  // namespace

std::uint64_t logTimestamp(std::uint64_t timeMs) {
    if (timeMs == 0) return 0;
    const std::uint64_t ticks = (timeMs - kModemEpochMs) * 4 / 5;
    return ticks << 16;
}

Bytes wcdmaCellPayload(const CapturedCell& cell) {
    Bytes payload(32, 0);
    putU32(payload, 0, cell.dlUarfcn - 950);  // UL UARFCN
    putU32(payload, 4, cell.dlUarfcn);
    putU32(payload, 8, 0x00120034);  // RNC 0x12, C-id 0x34
    putU16(payload, 12, 7);          // URA
    putU16(payload, 16, cell.psc << 4);
    const std::uint8_t plmn[6] = {0, 0, 1, 0, 1, 0x0F};  // MCC 001, MNC 01
    for (std::size_t i = 0; i < 6; ++i) payload[18 + i] = plmn[i];
    putU32(payload, 24, 0x1234);  // LAC
    putU32(payload, 28, 5);       // RAC
    return payload;
}

Bytes wcdmaCapture(std::span<const CapturedCell> cells) {
    Bytes out;
    for (const CapturedCell& cell : cells) {
        const Bytes payload = wcdmaCellPayload(cell);
        appendFrame(logPacket(0x4127, logTimestamp(cell.timeMs), payload), out);
    }
    return out;
}

void writeBytes(const std::string& path, const Bytes& bytes) {
    std::ofstream file(path, std::ios::binary | std::ios::trunc);
    file.write(reinterpret_cast<const char*>(bytes.data()),
               static_cast<std::streamsize>(bytes.size()));
    if (!file) throw std::runtime_error("cannot write " + path);
}

}  // namespace pyx::diag::test
