#include "app/ProgramSource.h"

#include <utility>

#include "baseband/VelkWrapper.h"
#include "core/MainQueue.h"

namespace pyx {

ProgramSource openProgramSource(sources::SourceOptions options,
                                const std::optional<std::string>& record, bool append,
                                const std::string& programVersion) {
    options.backlog = [] { return MainQueue::shared().pending() + VelkWrapper::queue().pending(); };
    ProgramSource source{sources::makeTransport(options), nullptr};
    if (record) {
        auto recorded =
            sources::recordSource(std::move(source.transport), options,
                                  sources::RecordOptions{*record, append, programVersion});
        source.transport = std::move(recorded.transport);
        source.recording = std::move(recorded.writer);
    }
    return source;
}

}  // namespace pyx
