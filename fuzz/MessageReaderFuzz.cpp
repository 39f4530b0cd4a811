// Every message class's reader on arbitrary bytes. The first input byte picks the class; the
// rest is the payload, copied into a heap buffer of exactly its size so that any read past
// its end is caught.
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <memory>
#include <span>

#include "core/Log.h"
#include "fuzz/MessageTable.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const bool silenced = [] {
        pyx::systemLogSink().intercept([](std::string_view) {});
        return true;
    }();
    static_cast<void>(silenced);
    if (size == 0) return 0;
    const auto classes = pyx::fuzz::fuzzClasses();
    const pyx::fuzz::FuzzClass& chosen = classes[data[0] % classes.size()];
    const std::size_t length = size - 1;
    const auto payload = std::make_unique<std::uint8_t[]>(length);
    if (length > 0) std::memcpy(payload.get(), data + 1, length);
    chosen.check(std::span<const std::uint8_t>(payload.get(), length));
    return 0;
}
