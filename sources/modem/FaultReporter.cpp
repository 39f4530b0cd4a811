#include "sources/modem/FaultReporter.h"

#include "core/Log.h"

namespace pyx::modem {

namespace {

// line with each run of digits as one '#'.
std::string withoutNumbers(std::string_view line) {
    std::string key;
    key.reserve(line.size());
    for (const char c : line) {
        const bool digit = c >= '0' && c <= '9';
        if (!digit)
            key += c;
        else if (key.empty() || key.back() != '#')
            key += '#';
    }
    return key;
}

}  // namespace

void FaultReporter::say(const std::string& topic, const std::string& line) {
    auto [it, inserted] = last_.try_emplace(topic, line);
    if (!inserted && it->second == line) return;
    it->second = line;
    systemFault(line);
}

void FaultReporter::clear(const std::string& topic) {
    last_.erase(topic);
}

void FaultReporter::once(const std::string& line) {
    if (full_) return;
    std::string key = withoutNumbers(line);
    if (said_.contains(key)) return;
    if (said_.size() == kOnceLimit) {
        full_ = true;
        systemFault("the modem source has said " + std::to_string(kOnceLimit) +
                    " different faults of what ModemManager gives; further faults not shown");
        return;
    }
    said_.insert(std::move(key));
    systemFault(line);
}

}  // namespace pyx::modem
