#include <cstring>
#include <limits>
#include <new>

#include "assertions.h"
#include "hmHeapMgr.h"

namespace Orv {

namespace {

/// What is in use beyond what was at its construction.
class UsageSince {
public:
    std::uint64_t blocks() const { return HmHeapMgr::getUsage().blocks - _before.blocks; }
    std::uint64_t bytes() const { return HmHeapMgr::getUsage().bytes - _before.bytes; }

private:
    HmHeapMgr::Usage _before = HmHeapMgr::getUsage();
};

TEST(HmHeapMgr, countsBlocksAndBytesThroughEveryCall) {
    const UsageSince usage;
    void* const none = HmHeapMgr::allocate(0);
    EXPECT_NE(none, nullptr);
    void* block = HmHeapMgr::reallocate(nullptr, 100);
    EXPECT_EQ(usage.blocks(), 2U);
    EXPECT_EQ(usage.bytes(), 100U);
    block = HmHeapMgr::reallocate(block, 100000);
    EXPECT_EQ(usage.bytes(), 100000U);
    block = HmHeapMgr::reallocate(block, 7);
    EXPECT_EQ(usage.blocks(), 2U);
    EXPECT_EQ(usage.bytes(), 7U);
    HmHeapMgr::release(block);
    HmHeapMgr::release(none);
    HmHeapMgr::release(nullptr);
    EXPECT_EQ(usage.blocks(), 0U);
    EXPECT_EQ(usage.bytes(), 0U);
}

TEST(HmHeapMgr, blocksAreAlignedAndKeepAlignmentAndContentsWhenResized) {
    const UsageSince usage;
    for (std::size_t alignment = 1; alignment <= 65536; alignment *= 2) {
        char* block = static_cast<char*>(HmHeapMgr::allocateAligned(1000, alignment));
        std::memset(block, 'x', 1000);
        for (const std::size_t size : {5000, 300}) {
            block = static_cast<char*>(HmHeapMgr::reallocate(block, size));
            EXPECT_EQ(reinterpret_cast<std::uintptr_t>(block) % alignment, 0U) << alignment;
            EXPECT_EQ(std::string(block, 300), std::string(300, 'x')) << alignment;
            std::memset(block, 'x', size);
        }
        HmHeapMgr::release(block);
    }
    EXPECT_EQ(usage.blocks(), 0U);
    EXPECT_EQ(usage.bytes(), 0U);
    EXPECT_THROW((void)HmHeapMgr::allocateAligned(1, 0), AssertionFailed);
    EXPECT_THROW((void)HmHeapMgr::allocateAligned(1, 24), AssertionFailed);
    EXPECT_THROW((void)HmHeapMgr::allocateAligned(1, std::size_t(1) << 31), AssertionFailed);
}

TEST(HmHeapMgr, sizesThatWouldWrapAroundAreOutOfMemory) {
    const UsageSince usage;
    constexpr std::size_t HUGE_SIZE = std::numeric_limits<std::size_t>::max();
    void* const block = HmHeapMgr::allocate(10);
    for (const std::size_t less : {0, 8, 15, 16, 4000}) {
        EXPECT_THROW((void)HmHeapMgr::allocateAligned(HUGE_SIZE - less, 4096), std::bad_alloc);
    }
    EXPECT_THROW((void)HmHeapMgr::allocate(HUGE_SIZE - 15), std::bad_alloc);
    EXPECT_THROW((void)HmHeapMgr::reallocate(block, HUGE_SIZE - 15), std::bad_alloc);
    EXPECT_EQ(usage.bytes(), 10U);
    HmHeapMgr::release(block);
}

TEST(HmHeapMgr, aShortageFailsWhatComesBehindItsGrant) {
    const UsageSince usage;
    void* block = HmHeapMgr::allocate(10);
    std::memset(block, 'y', 10);
    {
        const HmHeapMgr::Shortage shortage(2);
        EXPECT_THROW(HmHeapMgr::Shortage{1}, AssertionFailed);
        block = HmHeapMgr::reallocate(block, 20);
        void* const last = HmHeapMgr::allocate(1);
        EXPECT_THROW((void)HmHeapMgr::allocate(1), std::bad_alloc);
        EXPECT_THROW((void)HmHeapMgr::reallocate(block, 30), std::bad_alloc);
        HmHeapMgr::release(last);  // releasing grants nothing new
        EXPECT_THROW((void)HmHeapMgr::allocateAligned(1, 64), std::bad_alloc);
    }
    EXPECT_EQ(std::string(static_cast<char*>(block), 10), std::string(10, 'y'));
    EXPECT_EQ(usage.blocks(), 1U);
    EXPECT_EQ(usage.bytes(), 20U);
    HmHeapMgr::release(block);
    HmHeapMgr::release(HmHeapMgr::allocate(1));  // the shortage is over
}

TEST(HmHeapMgr, countsAddUpOverManyThreads) {
    const UsageSince usage;
    const auto work = [] {
        for (std::size_t i = 0; i < 5000; ++i) {
            void* const block = HmHeapMgr::reallocate(HmHeapMgr::allocate(i % 97), i % 61);
            HmHeapMgr::release(block);
        }
    };
    std::vector<std::jthread> threads;
    for (int i = 0; i < 4; ++i) threads.emplace_back(work);
    threads.clear();
    EXPECT_EQ(usage.blocks(), 0U);
    EXPECT_EQ(usage.bytes(), 0U);
}

}  // namespace

}  // namespace Orv
