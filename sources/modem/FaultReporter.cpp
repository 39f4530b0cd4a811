#include "sources/modem/FaultReporter.h"

#include <utility>

#include "core/Log.h"

namespace pyx::modem {

FaultReporter::FaultReporter(Sink sink) : sink_(std::move(sink)) {
    if (!sink_) sink_ = [](std::string_view line) { systemLog(line); };
}

void FaultReporter::say(const std::string& topic, const std::string& line) {
    auto [it, inserted] = last_.try_emplace(topic, line);
    if (!inserted && it->second == line) return;
    it->second = line;
    sink_(line);
}

void FaultReporter::clear(const std::string& topic) {
    last_.erase(topic);
}

bool FaultReporter::saying(const std::string& topic) const {
    return last_.contains(topic);
}

void FaultReporter::once(const std::string& line) {
    if (said_.insert(line).second) sink_(line);
}

}  // namespace pyx::modem
