// Where the intake's small blocks live: nested messages and the entries of dictionaries. A decode
// makes one of each for every nested record, and the store drops them by the thousand a second;
// with malloc each took a trip through glibc's bins (its per-thread cache keeps only seven blocks
// of a size, and a list of forty neighbours overflows it). Here each thread keeps free lists of
// its own, one per size class of 16 bytes up to 4 KiB, and a block goes back to the list of the
// thread that lets it go. Every list is capped, and all of a thread's lists together keep at
// most 1 MiB, so memory stays flat whichever thread makes and whichever drops; the rest goes
// back to the heap.
//
// Under AddressSanitizer the lists are bypassed, so that it still sees every use after free.
#pragma once

#include <cstddef>
#include <cstdint>
#include <new>

#if defined(__SANITIZE_ADDRESS__)
#define PYX_POOL_BYPASSED 1
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
#define PYX_POOL_BYPASSED 1
#endif
#endif

namespace pyx {

namespace pool {

inline constexpr std::size_t kGranule = 16;
inline constexpr std::size_t kLargestPooled = 4096;
inline constexpr std::size_t kClasses = kLargestPooled / kGranule;
// What one list may keep, in bytes (a few lists of forty neighbours of every size), and what
// all the lists of a thread may keep together: at most 1 MiB a thread stays out of the heap.
inline constexpr std::size_t kKeptBytesPerClass = 64 * 1024;
inline constexpr std::size_t kKeptBytesPerThread = 1024 * 1024;

struct FreeBlock {
    FreeBlock* next;
};

// The lists of one thread. Plain data, so that it can still be asked after the thread's
// clean-up has run (a block let go by a thread-local object destroyed later goes to the heap).
struct FreeLists {
    FreeBlock* head[kClasses];
    std::uint32_t count[kClasses];
    std::size_t keptBytes;  // in all the lists
    bool started;           // the clean-up is registered
    bool finished;          // the clean-up has run: lists are no longer kept
};
extern thread_local FreeLists tLists;

// The size class of a block of 1 to kLargestPooled bytes; kClasses or more for any other size.
inline std::size_t classOf(std::size_t bytes) {
    return (bytes - 1) / kGranule;
}
inline constexpr std::size_t blockSizeOf(std::size_t sizeClass) {
    return (sizeClass + 1) * kGranule;
}

// What the inline paths below leave to the library: an empty list, a full one, a thread
// without its clean-up yet, a size that is not pooled.
void* allocateSlow(std::size_t bytes);
void releaseSlow(void* block, std::size_t bytes) noexcept;

}  // namespace pool

// A block of at least `bytes` bytes, aligned as operator new aligns (16 bytes). Throws
// std::bad_alloc as operator new does.
[[nodiscard]] inline void* poolAllocate(std::size_t bytes) {
#ifndef PYX_POOL_BYPASSED
    const std::size_t c = pool::classOf(bytes);
    if (c < pool::kClasses) {
        pool::FreeLists& lists = pool::tLists;
        if (pool::FreeBlock* block = lists.head[c]) {
            lists.head[c] = block->next;
            --lists.count[c];
            lists.keptBytes -= pool::blockSizeOf(c);
            return block;
        }
    }
#endif
    return pool::allocateSlow(bytes);
}

// Gives back a block from poolAllocate of the same size.
inline void poolRelease(void* block, std::size_t bytes) noexcept {
#ifndef PYX_POOL_BYPASSED
    const std::size_t c = pool::classOf(bytes);
    if (c < pool::kClasses) {
        pool::FreeLists& lists = pool::tLists;
        if (lists.started && !lists.finished &&
            lists.count[c] < pool::kKeptBytesPerClass / pool::blockSizeOf(c) &&
            lists.keptBytes < pool::kKeptBytesPerThread) {
            auto* const freed = static_cast<pool::FreeBlock*>(block);
            freed->next = lists.head[c];
            lists.head[c] = freed;
            ++lists.count[c];
            lists.keptBytes += pool::blockSizeOf(c);
            return;
        }
    }
#endif
    pool::releaseSlow(block, bytes);
}

// The allocator of pooled blocks: std::allocate_shared takes it for a nested message (its
// object and its counts in one block), a dictionary for its entries.
template <class T>
struct PoolAllocator {
    using value_type = T;

    PoolAllocator() = default;
    template <class U>
    PoolAllocator(const PoolAllocator<U>& /*other*/) {}  // NOLINT: rebinding is implicit

    [[nodiscard]] T* allocate(std::size_t n) {
        static_assert(alignof(T) <= 16, "pooled blocks are aligned to 16 bytes");
        return static_cast<T*>(poolAllocate(n * sizeof(T)));
    }
    void deallocate(T* block, std::size_t n) noexcept { poolRelease(block, n * sizeof(T)); }

    template <class U>
    friend bool operator==(const PoolAllocator& /*a*/, const PoolAllocator<U>& /*b*/) {
        return true;
    }
};

}  // namespace pyx
