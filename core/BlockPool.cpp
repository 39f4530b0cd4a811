#include "core/BlockPool.h"

namespace pyx::pool {

thread_local FreeLists tLists{};

#ifdef PYX_POOL_BYPASSED

void* allocateSlow(std::size_t bytes) {
    return ::operator new(bytes);
}

void releaseSlow(void* block, std::size_t /*bytes*/) noexcept {
    ::operator delete(block);
}

#else

namespace {

void drain(FreeLists& lists) noexcept {
    for (std::size_t c = 0; c < kClasses; ++c) {
        while (FreeBlock* block = lists.head[c]) {
            lists.head[c] = block->next;
            ::operator delete(block);
        }
        lists.count[c] = 0;
    }
    lists.keptBytes = 0;
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

// A pooled size is taken from the heap at its class's full size, so that any block of the
// class can serve any request of it later.
void* allocateSlow(std::size_t bytes) {
    const std::size_t c = classOf(bytes);
    if (c >= kClasses) return ::operator new(bytes);
    if (!tLists.started) registerCleanUp();
    return ::operator new(blockSizeOf(c));
}

// The inline release keeps every block it can once the thread's clean-up is registered; the
// one it leaves here that a list could still take is the first of a thread.
void releaseSlow(void* block, std::size_t bytes) noexcept {
    if (classOf(bytes) < kClasses && !tLists.started) {
        registerCleanUp();
        poolRelease(block, bytes);
        return;
    }
    ::operator delete(block);
}

#endif

}  // namespace pyx::pool
