// Writes the DIAG fuzz targets' seed inputs with our own packet writers, one file per input:
//   corpus/diag_stream/    a piece size byte, then framed streams: a log packet of every row's
//                          code and version, event reports, multi-SIM frames, responses, noise
//   corpus/diag_decoders/  a row index (u16), then a payload of a few sizes
// Usage: pyxon_diag_fuzz_seeds <fuzz/corpus directory>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <string>
#include <vector>

#include "fuzz/DiagRows.h"
#include "sources/diag/stream/DiagStream.h"

namespace {

namespace fs = std::filesystem;
using pyx::Bytes;

void write(const fs::path& dir, const std::string& name, const Bytes& bytes) {
    fs::create_directories(dir);
    std::ofstream out(dir / name, std::ios::binary | std::ios::trunc);
    out.write(reinterpret_cast<const char*>(bytes.data()),
              static_cast<std::streamsize>(bytes.size()));
    if (!out) throw std::runtime_error("cannot write " + (dir / name).string());
}

// A payload of size bytes: small numbers (counts that fit) after the version byte.
Bytes payloadOf(int version, std::size_t size, std::uint8_t salt) {
    Bytes p(size);
    for (std::size_t i = 0; i < size; ++i)
        p[i] = static_cast<std::uint8_t>((i * 7 + salt) % (salt % 2 == 0 ? 4 : 251));
    if (!p.empty() && version != pyx::diag::kAnyVersion) p[0] = static_cast<std::uint8_t>(version);
    return p;
}

// 2020-01-01 in the modem's ticks (1.25 ms since 1980-01-06, upper 48 bits).
constexpr std::uint64_t kStamp = ((1577836800000ULL - 315964800000ULL) * 4 / 5) << 16;

}  // namespace

int main(int argc, char** argv) {
    if (argc != 2) {
        std::cerr << "usage: pyxon_diag_fuzz_seeds <fuzz/corpus directory>\n";
        return 2;
    }
    const fs::path root(argv[1]);
    try {
        const auto& rows = pyx::fuzz::diagRows();
        Bytes all = {0x20, 0x7E};  // pieces of 33 bytes; a leading flag
        for (std::size_t i = 0; i < rows.size(); ++i) {
            const auto& row = rows[i];
            const std::string name = "row-" + std::to_string(i);
            for (const std::size_t size : {std::size_t{8}, std::size_t{48}, std::size_t{200}}) {
                const int version = row.log != nullptr ? row.log->version : pyx::diag::kAnyVersion;
                Bytes seed = {static_cast<std::uint8_t>(i & 0xFF),
                              static_cast<std::uint8_t>(i >> 8)};
                const Bytes payload = payloadOf(version, size, static_cast<std::uint8_t>(size));
                seed.insert(seed.end(), payload.begin(), payload.end());
                write(root / "diag_decoders", name + "-" + std::to_string(size), seed);
            }
            Bytes stream = {0xFF};
            const Bytes payload =
                payloadOf(row.log != nullptr ? row.log->version : pyx::diag::kAnyVersion, 64, 3);
            if (row.log != nullptr) {
                const Bytes packet = pyx::diag::logPacket(row.log->code, kStamp, payload);
                pyx::diag::appendFrame(packet, stream);
                pyx::diag::appendFrame(pyx::diag::multiSim(1, packet), stream);
            } else {
                const std::vector<pyx::diag::WrittenEvent> events = {
                    {row.event->id, kStamp, Bytes(payload.begin(), payload.begin() + 1), false},
                    {row.event->id, kStamp, Bytes(payload.begin(), payload.begin() + 2), true},
                    {row.event->id, kStamp, payload, false}};
                pyx::diag::appendFrame(pyx::diag::eventReport(events), stream);
            }
            write(root / "diag_stream", name, stream);
            all.insert(all.end(), stream.begin() + 1, stream.end());
        }
        // Event reports of every payload form, responses, two subscriptions, noise, a cut frame.
        const std::vector<pyx::diag::WrittenEvent> events = {{1606, kStamp, {}, false},
                                                             {1606, kStamp, {2}, true},
                                                             {1609, kStamp, {1, 2}, false},
                                                             {1994, kStamp, {1, 2, 3, 4}, true}};
        const Bytes report = pyx::diag::eventReport(events);
        const Bytes log = pyx::diag::logPacket(0xB0C0, kStamp, payloadOf(15, 40, 5));
        Bytes mixed = {0x03, 0x12, 0x7D, 0x34, 0x7E};
        for (const Bytes& packet :
             {report, pyx::diag::multiSim(2, log), pyx::diag::multiSim(1, log),
              pyx::diag::multiSim(2, report), Bytes{0x00, 'A', 'p', 'r'},
              Bytes{0x73, 0, 0, 0, 3, 0, 0, 0, 0, 0, 0, 0}, Bytes{0x60, 0x00, 0x00},
              Bytes{0x7D, 0x05, 0x01, 0x00}})
            pyx::diag::appendFrame(packet, mixed);
        mixed.insert(mixed.end(), {0x10, 0x00, 0x7D});
        write(root / "diag_stream", "mixed", mixed);
        all.insert(all.end(), mixed.begin() + 1, mixed.end());
        write(root / "diag_stream", "all", all);
        std::cout << rows.size() << " decoder rows turned into seeds under " << root << "\n";
    } catch (const std::exception& e) {
        std::cerr << "pyxon_diag_fuzz_seeds: " << e.what() << "\n";
        return 1;
    }
    return 0;
}
