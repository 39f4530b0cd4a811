#include "core/BlockPool.h"

#include <cstdint>

#if defined(__SANITIZE_ADDRESS__)
#define PYX_POOL_BYPASSED 1
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
#define PYX_POOL_BYPASSED 1
#endif
#endif

namespace pyx {

namespace {

constexpr std::size_t kGranule = 16;
constexpr std::size_t kLargestPooled = 1024;
constexpr std::size_t kClasses = kLargestPooled / kGranule;
// What one list may keep, in bytes: a few lists of forty neighbours of every size.
constexpr std::size_t kKeptBytesPerClass = 64 * 1024;

constexpr std::size_t classOf(std::size_t bytes) {
    return (bytes + kGranule - 1) / kGranule - 1;
}
constexpr std::size_t blockSizeOf(std::size_t sizeClass) {
    return (sizeClass + 1) * kGranule;
}

struct FreeBlock {
    FreeBlock* next;
};

// The lists of one thread. Plain data, so that it can still be asked after the thread's
// clean-up has run (a block let go by a thread-local object destroyed later goes to the heap).
struct FreeLists {
    FreeBlock* head[kClasses];
    std::uint32_t count[kClasses];
    bool started;   // the clean-up is registered
    bool finished;  // the clean-up has run: lists are no longer kept
};
thread_local FreeLists tLists{};

void drain(FreeLists& lists) noexcept {
    for (std::size_t c = 0; c < kClasses; ++c) {
        while (FreeBlock* block = lists.head[c]) {
            lists.head[c] = block->next;
            ::operator delete(block, blockSizeOf(c));
        }
        lists.count[c] = 0;
    }
}

// Gives the thread's kept blocks back to the heap when the thread ends.
struct CleanUp {
    CleanUp() = default;
    CleanUp(const CleanUp&) = delete;
    CleanUp& operator=(const CleanUp&) = delete;
    ~CleanUp() {
        tLists.finished = true;
        drain(tLists);
    }
};

void registerCleanUp() {
    tLists.started = true;
    thread_local const CleanUp cleanUp;
}

}  // namespace

#ifdef PYX_POOL_BYPASSED

void* poolAllocate(std::size_t bytes) {
    return ::operator new(bytes);
}

void poolRelease(void* block, std::size_t bytes) noexcept {
    ::operator delete(block, bytes);
}

#else

void* poolAllocate(std::size_t bytes) {
    if (bytes == 0 || bytes > kLargestPooled) {
        return ::operator new(bytes);
    }
    const std::size_t c = classOf(bytes);
    FreeLists& lists = tLists;
    if (FreeBlock* block = lists.head[c]) {
        lists.head[c] = block->next;
        --lists.count[c];
        return block;
    }
    if (!lists.started) registerCleanUp();
    return ::operator new(blockSizeOf(c));
}

void poolRelease(void* block, std::size_t bytes) noexcept {
    if (bytes == 0 || bytes > kLargestPooled) {
        ::operator delete(block, bytes);
        return;
    }
    const std::size_t c = classOf(bytes);
    FreeLists& lists = tLists;
    if (!lists.started) registerCleanUp();
    if (lists.finished || lists.count[c] >= kKeptBytesPerClass / blockSizeOf(c)) {
        ::operator delete(block, blockSizeOf(c));
        return;
    }
    auto* freed = static_cast<FreeBlock*>(block);
    freed->next = lists.head[c];
    lists.head[c] = freed;
    ++lists.count[c];
}

#endif

}  // namespace pyx
