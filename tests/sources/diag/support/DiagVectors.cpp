#include "tests/sources/diag/support/DiagVectors.h"

#include <fstream>
#include <stdexcept>

namespace pyx::diag::test {

std::filesystem::path sharedDiag() {
    return PYXON_SHARED_DIAG;
}

bool haveSharedDiag() {
    return std::filesystem::is_directory(sharedDiag());
}

Bytes fromHex(const std::string& hex) {
    Bytes bytes;
    bytes.reserve(hex.size() / 2);
    const auto digit = [&](char c) -> int {
        if (c >= '0' && c <= '9') return c - '0';
        if (c >= 'a' && c <= 'f') return c - 'a' + 10;
        if (c >= 'A' && c <= 'F') return c - 'A' + 10;
        throw std::invalid_argument("not hex: " + hex);
    };
    for (std::size_t i = 0; i + 1 < hex.size(); i += 2)
        bytes.push_back(static_cast<std::uint8_t>(digit(hex[i]) * 16 + digit(hex[i + 1])));
    return bytes;
}

namespace {

std::string text(const nlohmann::json& record, const char* key) {
    const auto it = record.find(key);
    return it != record.end() && it->is_string() ? it->get<std::string>() : std::string();
}

std::vector<Vector> load() {
    std::vector<Vector> all;
    std::ifstream in(sharedDiag() / "vectors.jsonl");
    std::string line;
    while (std::getline(in, line)) {
        if (line.empty()) continue;
        const auto record = nlohmann::json::parse(line);
        Vector v;
        v.id = text(record, "id");
        v.kind = text(record, "kind");
        v.logCode = text(record, "log_code");
        v.scope = text(record, "scope");
        v.bytes = fromHex(text(record, "hex"));
        const std::string synth = text(record, "log_packet_hex_synth");
        v.packet = synth.empty() ? v.bytes : fromHex(synth);
        v.frame = fromHex(text(record, "hdlc_frame_hex_synth"));
        if (record.contains("expect")) v.expect = record["expect"];
        if (record.contains("tolerance") && record["tolerance"].contains("float_fields_abs"))
            v.tolerance = record["tolerance"]["float_fields_abs"].get<double>() + 0.0001;
        v.raw = record;
        all.push_back(std::move(v));
    }
    return all;
}

}  // namespace

const std::vector<Vector>& vectors() {
    static const std::vector<Vector> all = load();
    return all;
}

const Vector& vector(const std::string& id) {
    for (const Vector& v : vectors())
        if (v.id == id) return v;
    throw std::out_of_range("no vector " + id);
}

}  // namespace pyx::diag::test
