#include <cstring>
#include <gtest/gtest.h>
#include <numeric>
#include <sstream>
#include <vector>

#include "daArenaPool.h"
#include "daMallocAllocator.h"
#include "daMemoryMapAllocator.h"
#include "exSysError.h"
#include "expectThrows.h"
#include "hmHeapMgr.h"

// The sanitizers' allocators are to return null for too much memory, as malloc() does.
extern "C" const char* __asan_default_options();
extern "C" const char* __tsan_default_options();
extern "C" const char* __asan_default_options() {
    return "allocator_may_return_null=1";
}
extern "C" const char* __tsan_default_options() {
    return "allocator_may_return_null=1";
}

namespace Orv {

namespace {

constexpr std::uint64_t SIZE = 1 << 20;

/// Counts what is out, and may have nothing to give.
class CountingAllocator : public DaArenaAllocator {
public:
    void* allocate(std::uint64_t size) override {
        if (isEmpty) throw ExSysError("test", 1, "CountingAllocator", 12);
        ++nbAllocated;
        bytes += size;
        return _memory;
    }
    void deallocate(void* block, std::uint64_t size) override {
        EXPECT_EQ(block, _memory);
        bytes -= size;
        ++nbDeallocated;
    }

    bool isEmpty = false;
    int nbAllocated = 0;
    int nbDeallocated = 0;
    std::uint64_t bytes = 0;

private:
    alignas(64) char _memory[4096] = {};
};

/// Cuts the whole pool up, fills the pieces with different bytes and looks whether they stay.
void expectHoldsItsBlocks(DaArenaPool& pool) {
    ASSERT_EQ(pool.getSize(), SIZE);
    std::vector<unsigned char*> blocks;
    constexpr std::uint64_t BLOCK = 1000;
    while (void* const block = pool.allocate(BLOCK, 64)) {
        EXPECT_EQ(reinterpret_cast<std::uintptr_t>(block) % 64, 0u);
        std::memset(block, static_cast<int>(blocks.size() % 251), BLOCK);
        blocks.push_back(static_cast<unsigned char*>(block));
    }
    EXPECT_GE(blocks.size(), SIZE / 1024 - 1);
    for (std::size_t i = 0; i < blocks.size(); ++i) {
        EXPECT_EQ(std::accumulate(blocks[i], blocks[i] + BLOCK, 0u), i % 251 * BLOCK) << i;
    }
    for (unsigned char* const block : blocks) pool.deallocate(block);
    EXPECT_EQ(pool.getStatistics().largestFreeBlock, SIZE);
    void* const whole = pool.allocate(SIZE, 0);
    ASSERT_NE(whole, nullptr);
    std::memset(whole, 1, SIZE);
    pool.deallocate(whole);
    expectAsserts("blockEntry != _allocatedBlocks.end()", [&] { pool.deallocate(whole); });
}

TEST(DaArenaPool, handsOutTheMemoryOfEveryKindOfAllocator) {
    ObjPtr<DaMallocAllocator> heap = DaMallocAllocator::create();
    expectHoldsItsBlocks(*ObjPtr<DaArenaPool>(DaArenaPool::create(heap.get(), SIZE)));
    ObjPtr<DaMemoryMapAllocator> mapping = DaMemoryMapAllocator::create("daArenaPoolTest");
    expectHoldsItsBlocks(*ObjPtr<DaArenaPool>(DaArenaPool::create(mapping.get(), SIZE)));
    expectHoldsItsBlocks(*ObjPtr<DaArenaPool>(DaArenaPool::create(nullptr, SIZE)));
    for (const DaPages pages : {DaPages::NORMAL, DaPages::HUGE_IF_OFFERED}) {
        expectHoldsItsBlocks(*ObjPtr<DaArenaPool>(DaArenaPool::create(SIZE, pages)));
    }
}

TEST(DaArenaPool, givesItsBlockBackWithWhatIsStillHandedOut) {
    CountingAllocator allocator;
    {
        ObjPtr<DaArenaPool> pool = DaArenaPool::create(&allocator, 4096);
        (void)pool->allocate(64, 0);
        EXPECT_EQ(allocator.bytes, 4096u);
    }
    EXPECT_EQ(allocator.nbDeallocated, 1);
    EXPECT_EQ(allocator.bytes, 0u);
}

TEST(DaArenaPool, throwsWhatTheAllocatorThrows) {
    CountingAllocator allocator;
    allocator.isEmpty = true;
    EXPECT_THROW((void)DaArenaPool::create(&allocator, 4096), ExSysError);
    EXPECT_EQ(allocator.nbDeallocated, 0);
    expectAsserts("size > 0", [&] { (void)DaArenaPool::create(&allocator, 0); });
    expectAsserts("size > 0", [] { (void)DaArenaPool::create(nullptr, 0); });
}

TEST(DaArenaPool, keepsNoBlockWhenItsBooksFindNoMemory) {
    CountingAllocator allocator;
    int nbRefused = 0;
    for (std::uint32_t nbGranted = 0;; ++nbGranted) {
        ObjPtr<DaArenaPool> pool;
        try {
            const HmHeapMgr::Shortage shortage(nbGranted);
            pool = DaArenaPool::create(&allocator, 4096);
        } catch (const std::bad_alloc&) {
            ++nbRefused;
        }
        if (!pool.isNull()) break;
        EXPECT_EQ(allocator.nbAllocated, allocator.nbDeallocated);
    }
    EXPECT_GT(nbRefused, 1);
    EXPECT_EQ(allocator.nbAllocated, allocator.nbDeallocated);
}

TEST(DaArenaPool, throwsTheSystemsErrorForMoreThanThereIs) {
    ObjPtr<DaMallocAllocator> heap = DaMallocAllocator::create();
    const auto expectRefused = [](const char* what, auto make) {
        try {
            make();
            ADD_FAILURE() << what << " gave it";
        } catch (const ExSysError& error) {
            EXPECT_NE(error.getOsError(), 0) << what;
        }
    };
    for (const std::uint64_t size : {std::uint64_t(1) << 62, ~std::uint64_t(0)}) {
        expectRefused("malloc", [&] { (void)DaArenaPool::create(heap.get(), size); });
        expectRefused("pages", [&] { (void)DaArenaPool::create(nullptr, size); });
        expectRefused("huge pages",
                      [&] { (void)DaArenaPool::create(size, DaPages::HUGE_IF_OFFERED); });
        expectRefused("huge pages only",
                      [&] { (void)DaArenaPool::create(size, DaPages::HUGE_ONLY); });
    }
}

}  // namespace

}  // namespace Orv
