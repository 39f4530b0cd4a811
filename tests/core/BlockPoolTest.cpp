#include "core/BlockPool.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <memory>
#include <thread>
#include <vector>

namespace {

struct Nested {
    std::uint64_t a = 1;
    std::vector<int> values{1, 2, 3};
};

TEST(BlockPool, ABlockLetGoIsTheNextOneMadeOfItsSize) {
    void* first = pyx::poolAllocate(40);
    std::memset(first, 0xAB, 40);
    pyx::poolRelease(first, 40);
    void* second = pyx::poolAllocate(48);  // the same class of 16 bytes
    pyx::poolRelease(second, 48);
#ifndef PYX_POOL_BYPASSED
    EXPECT_EQ(first, second);
#endif
}

TEST(BlockPool, AThreadKeepsNoMoreThanItsCaps) {
    std::thread([] {
        std::vector<void*> blocks;
        for (const std::size_t size : {64U, 1024U, 4096U}) {
            for (int i = 0; i < 2000; ++i) blocks.push_back(pyx::poolAllocate(size));
            for (void* block : blocks) pyx::poolRelease(block, size);
            blocks.clear();
#ifndef PYX_POOL_BYPASSED
            const std::size_t c = pyx::pool::classOf(size);
            EXPECT_LE(pyx::pool::tLists.count[c] * size, pyx::pool::kKeptBytesPerClass) << size;
            EXPECT_GT(pyx::pool::tLists.count[c], 0U) << size;
#endif
        }
#ifndef PYX_POOL_BYPASSED
        EXPECT_LE(pyx::pool::tLists.keptBytes, pyx::pool::kKeptBytesPerThread);
#endif
    }).join();
}

TEST(BlockPool, BlocksAreAlignedAndLargeOnesComeFromTheHeap) {
    for (const std::size_t size : {1U, 16U, 17U, 1000U, 1024U, 1025U, 100000U}) {
        void* block = pyx::poolAllocate(size);
        EXPECT_EQ(reinterpret_cast<std::uintptr_t>(block) % 16, 0U) << size;
        std::memset(block, 0, size);
        pyx::poolRelease(block, size);
    }
}

TEST(BlockPool, SharedObjectsMadeOnOneThreadAreDroppedOnAnother) {
    std::vector<std::shared_ptr<Nested>> made;
    std::thread maker([&made] {
        for (int i = 0; i < 10000; ++i)
            made.push_back(std::allocate_shared<Nested>(pyx::PoolAllocator<Nested>{}));
    });
    maker.join();
    ASSERT_EQ(made.size(), 10000U);
    EXPECT_EQ(made.back()->values, (std::vector<int>{1, 2, 3}));
    made.clear();  // here, on this thread: its lists keep what their cap allows
    std::thread other([] {
        const auto one = std::allocate_shared<Nested>(pyx::PoolAllocator<Nested>{});
        EXPECT_EQ(one->a, 1U);
    });
    other.join();
}

TEST(BlockPool, AContainerTakesItAsItsAllocator) {
    std::vector<std::uint64_t, pyx::PoolAllocator<std::uint64_t>> values;
    for (std::uint64_t i = 0; i < 1000; ++i) values.push_back(i);
    EXPECT_EQ(values[999], 999U);
    const auto copy = values;
    EXPECT_EQ(copy, values);
}

}  // namespace
