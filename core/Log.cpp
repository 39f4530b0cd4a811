#include "core/Log.h"

#include <algorithm>
#include <memory>
#include <mutex>
#include <vector>

namespace pyx {

namespace {
std::mutex& sinkMutex() {
    static std::mutex m;
    return m;
}
}  // namespace

void LineSink::write(std::string_view text) {
    if (on()) writeAlways(text);
}

void LineSink::writeAlways(std::string_view text) {
    const std::lock_guard lock(sinkMutex());
    if (writer_) {
        writer_(text);
        return;
    }
    std::string line;
    line.reserve(text.size() + 1);
    line.append(text);
    line.push_back('\n');
    std::fwrite(line.data(), 1, line.size(), file_);
    std::fflush(file_);
}

void LineSink::redirect(std::FILE* file) {
    const std::lock_guard lock(sinkMutex());
    file_ = file;
}

void LineSink::intercept(Writer writer) {
    const std::lock_guard lock(sinkMutex());
    writer_ = std::move(writer);
}

LineSink& systemLogSink() {
    static LineSink sink(stderr);
    return sink;
}

LineSink& standardOutputSink() {
    static LineSink sink(stdout);
    return sink;
}

struct CapturedLines::State {
    mutable std::mutex mutex;
    std::vector<std::string> lines;
};

CapturedLines::CapturedLines(LineSink& sink) : sink_(sink), state_(std::make_shared<State>()) {
    sink_.intercept([state = state_](std::string_view line) {
        const std::lock_guard lock(state->mutex);
        state->lines.emplace_back(line);
    });
}

CapturedLines::~CapturedLines() {
    sink_.intercept({});
}

std::vector<std::string> CapturedLines::lines() const {
    const std::lock_guard lock(state_->mutex);
    return state_->lines;
}

bool CapturedLines::contains(std::string_view line) const {
    const std::lock_guard lock(state_->mutex);
    return std::find(state_->lines.begin(), state_->lines.end(), line) != state_->lines.end();
}

void CapturedLines::clear() {
    const std::lock_guard lock(state_->mutex);
    state_->lines.clear();
}

}  // namespace pyx
