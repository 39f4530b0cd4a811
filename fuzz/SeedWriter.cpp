// Writes the fuzz targets' seed inputs from the benchmark corpus, one file per input:
//   corpus/message_reader/  class byte + payload of every record, and of every nested record
//   corpus/intake/          catalogue byte + payload of every record
//   corpus/record_reader/   every corpus line
// Usage: pyxon_fuzz_seeds <metrics.jsonl> <fuzz/corpus directory>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <string>

#include "fuzz/MessageTable.h"
#include "metrics/MetricCatalogue.h"
#include "tools/RecordReader.h"

namespace {

namespace fs = std::filesystem;

void write(const fs::path& dir, const std::string& name, const std::string& bytes) {
    fs::create_directories(dir);
    std::ofstream out(dir / name, std::ios::binary | std::ios::trunc);
    out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    if (!out) throw std::runtime_error("cannot write " + (dir / name).string());
}

std::string withByte(std::uint8_t first, const pyx::Bytes& payload) {
    std::string s(1, static_cast<char>(first));
    s.append(payload.begin(), payload.end());
    return s;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 3) {
        std::cerr << "usage: pyxon_fuzz_seeds <metrics.jsonl> <fuzz/corpus directory>\n";
        return 2;
    }
    std::ifstream in(argv[1]);
    if (!in) {
        std::cerr << "pyxon_fuzz_seeds: cannot read " << argv[1] << "\n";
        return 1;
    }
    const fs::path root(argv[2]);
    const auto catalogue = pyx::metricCatalogue();
    std::string line;
    int number = 0;
    try {
        while (std::getline(in, line)) {
            if (line.empty()) continue;
            ++number;
            const std::string name = "corpus-" + std::to_string(number);
            write(root / "record_reader", name, line);
            const pyx::MetricRecord record = pyx::readRecord(line);
            const std::int64_t id = record.find("kKeyMetricID")->asInt();
            const pyx::Bytes& payload = record.find("kKeyPayload")->asBytes();
            for (std::size_t i = 0; i < catalogue.size(); ++i) {
                if (catalogue[i].id != id) continue;
                write(root / "intake", name, withByte(static_cast<std::uint8_t>(i), payload));
                const int cls = pyx::fuzz::fuzzClassIndex(catalogue[i].messageClass);
                if (cls >= 0) {
                    write(root / "message_reader", name,
                          withByte(static_cast<std::uint8_t>(cls), payload));
                }
            }
        }
    } catch (const std::exception& e) {
        std::cerr << "pyxon_fuzz_seeds: line " << number << ": " << e.what() << "\n";
        return 1;
    }
    std::cout << number << " corpus lines turned into seeds under " << root << "\n";
    return 0;
}
