// Where the intake's small blocks live: nested messages and the entries of dictionaries. A decode
// makes one of each for every nested record, and the store drops them by the thousand a second;
// with malloc each took a trip through glibc's bins (its per-thread cache keeps only seven blocks
// of a size, and a list of forty neighbours overflows it). Here each thread keeps free lists of
// its own, one per size class of 16 bytes up to 1 KiB, and a block goes back to the list of the
// thread that lets it go. Every list is capped, so memory stays flat whichever thread makes and
// whichever drops; the rest goes back to the heap.
//
// Under AddressSanitizer the lists are bypassed, so that it still sees every use after free.
#pragma once

#include <cstddef>
#include <new>

namespace pyx {

// A block of at least `bytes` bytes, aligned as operator new aligns (16 bytes). Throws
// std::bad_alloc as operator new does.
[[nodiscard]] void* poolAllocate(std::size_t bytes);
// Gives back a block from poolAllocate of the same size.
void poolRelease(void* block, std::size_t bytes) noexcept;

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
    template <class U>
    friend bool operator!=(const PoolAllocator& /*a*/, const PoolAllocator<U>& /*b*/) {
        return false;
    }
};

}  // namespace pyx
