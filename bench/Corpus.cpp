#include "bench/Corpus.h"

#include <fstream>
#include <nlohmann/json.hpp>

#include "tools/RecordReader.h"

namespace pyx::bench {

std::vector<CorpusRecord> loadCorpus(const std::string& path) {
    std::ifstream in(path);
    if (!in) throw CorpusError("cannot read the corpus " + path);
    std::vector<CorpusRecord> records;
    std::string line;
    for (int number = 1; std::getline(in, line); ++number) {
        if (line.empty()) continue;
        const auto where = path + ":" + std::to_string(number) + ": ";
        CorpusRecord r;
        try {
            r.record = readRecord(line);
        } catch (const RecordError& e) {
            throw CorpusError(where + e.reason());
        }
        const Value* id = r.record.find("kKeyMetricID");
        const Value* payload = r.record.find("kKeyPayload");
        if (id == nullptr || !id->isInt() || payload == nullptr || !payload->isBytes()) {
            throw CorpusError(where + "a corpus record needs an integer ID and a payload");
        }
        r.metricID = id->asInt();
        r.payload = payload->asBytes();
        const auto json = nlohmann::json::parse(line);
        if (const auto label = json.find("label"); label != json.end() && label->is_string()) {
            r.label = label->get<std::string>();
        }
        r.large = r.label.starts_with("large:");
        records.push_back(std::move(r));
    }
    if (records.empty()) throw CorpusError("the corpus " + path + " holds no records");
    return records;
}

}  // namespace pyx::bench
