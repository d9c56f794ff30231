#include <gtest/gtest.h>
#include <map>
#include <random>
#include <sstream>
#include <vector>

#include "daFirstFitArena.h"
#include "expectThrows.h"
#include "hmHeapMgr.h"

namespace Orv {

namespace {

using Address = std::uint64_t;

constexpr Address BASE = Address(1) << 40;
constexpr Address KIB = 1024;
constexpr Address GIB = Address(1) << 30;

void* pointerTo(Address address) {
    return reinterpret_cast<void*>(address);
}

/// First fit as it is defined: a walk over the free blocks from the lowest address.
class Model {
public:
    Model(Address base, Address size) : free{{base, size}} {}

    Address allocate(Address size, Address alignment) {
        size = (std::max<Address>(size, 1) + 7) / 8 * 8;
        if (alignment == 0) alignment = 1;
        for (auto it = free.begin(); it != free.end(); ++it) {
            const auto [address, length] = *it;
            const Address padding = (alignment - address % alignment) % alignment;
            if (padding > length || length - padding < size) continue;
            free.erase(it);
            if (padding > 0) free[address] = padding;
            const Address rest = length - padding - size;
            if (rest > 0) free[address + padding + size] = rest;
            taken[address + padding] = size;
            return address + padding;
        }
        return 0;
    }

    void deallocate(Address address) {
        auto it = free.emplace(address, taken.at(address)).first;
        taken.erase(address);
        const auto next = std::next(it);
        if (next != free.end() && it->first + it->second == next->first) {
            it->second += next->second;
            free.erase(next);
        }
        if (it == free.begin()) return;
        const auto before = std::prev(it);
        if (before->first + before->second == it->first) {
            before->second += it->second;
            free.erase(it);
        }
    }

    std::map<Address, Address> free;
    std::map<Address, Address> taken;
};

/// Offset and length of each free block, as the arena lists them.
std::vector<std::pair<Address, Address>> freeBlocksOf(const DaFirstFitArena& arena) {
    std::ostringstream stream;
    arena.dumpFreeBlocks(stream);
    std::istringstream lines(stream.str());
    std::string heading;
    std::getline(lines, heading);
    std::getline(lines, heading);
    std::vector<std::pair<Address, Address>> blocks;
    for (Address offset, length; lines >> offset >> length;) blocks.emplace_back(offset, length);
    return blocks;
}

void expectSame(const DaFirstFitArena& arena, const Model& model, Address base) {
    std::vector<std::pair<Address, Address>> expected;
    Address freeBytes = 0;
    Address largest = 0;
    for (const auto& [address, length] : model.free) {
        expected.emplace_back(address - base, length);
        freeBytes += length;
        largest = std::max(largest, length);
    }
    EXPECT_EQ(freeBlocksOf(arena), expected);
    const DaArenaStatistics statistics = arena.getStatistics();
    EXPECT_EQ(statistics.freeBytes, freeBytes);
    EXPECT_EQ(statistics.largestFreeBlock, largest);
    EXPECT_EQ(statistics.nbFreeBlocks, model.free.size());
    EXPECT_EQ(statistics.nbAllocatedBlocks, model.taken.size());
}

/// Where and how an arena is used at random.
struct Life {
    const char* label;
    Address base;
    Address size;
    Address largestRequest;
    std::vector<Address> alignments;
    std::size_t nbBlocksMax;
    int nbSteps;
};

void PrintTo(const Life& life, std::ostream* stream) {
    *stream << life.label;
}

class DaFirstFitArenaLife : public testing::TestWithParam<Life> {};

TEST_P(DaFirstFitArenaLife, givesEveryBlockTheAddressOfAPlainWalk) {
    const Life& life = GetParam();
    DaFirstFitArena arena(pointerTo(life.base), life.size);
    Model model(life.base, life.size);
    std::mt19937_64 random(7);
    std::vector<Address> live;
    int nbFailures = 0;
    for (int i = 0; i < life.nbSteps; ++i) {
        // Fills up and empties by turns, so that blocks join at every size of the tree.
        const bool isFilling = (i / 20'000) % 2 == 0;
        const bool allocates = live.empty() || (live.size() < life.nbBlocksMax &&
                                                random() % 8 < (isFilling ? 5u : 3u));
        if (allocates) {
            const Address scale = Address(1) << random() % 12;
            const Address size = random() % std::max<Address>(life.largestRequest / scale, 1);
            const Address alignment = life.alignments[random() % life.alignments.size()];
            const Address expected = model.allocate(size, alignment);
            ASSERT_EQ(arena.allocate(size, alignment), pointerTo(expected))
                << "step " << i << ", size " << size << ", alignment " << alignment;
            if (expected == 0) {
                ++nbFailures;
            } else {
                live.push_back(expected);
            }
        } else {
            std::swap(live[random() % live.size()], live.back());
            arena.deallocate(pointerTo(live.back()));
            model.deallocate(live.back());
            live.pop_back();
        }
        if (i % 50'000 == 0) expectSame(arena, model, life.base);
    }
    expectSame(arena, model, life.base);
    EXPECT_GT(nbFailures, 0) << "the arena was never full: it is not tested there";
    for (const Address address : live) {
        arena.deallocate(pointerTo(address));
        model.deallocate(address);
    }
    expectSame(arena, model, life.base);
    EXPECT_EQ(freeBlocksOf(arena).size(), 1u);
}

INSTANTIATE_TEST_SUITE_P(
    DaFirstFitArena, DaFirstFitArenaLife,
    testing::Values(
        Life{"manySmallBlocks", BASE, 96 * KIB, KIB, {0, 8, 16}, 1500, 400'000},
        Life{"deepTree", BASE, 300 * KIB, KIB, {0, 16}, 8000, 120'000},
        Life{"everyAlignment",
             BASE,
             256 * KIB,
             2 * KIB,
             {0, 1, 2, 4, 8, 16, 32, 64, 256, 4096, 65536, Address(1) << 40},
             600,
             300'000},
        Life{"oneAlignment", BASE + 8, 512 * KIB, 8 * KIB, {4096}, 400, 100'000},
        Life{"oddBase", BASE + 3, 30'001, KIB, {0, 1, 2, 4, 8, 16, 64}, 400, 100'000},
        Life{"oddSize", BASE, 30'001, KIB, {0, 64}, 400, 50'000},
        // Beyond 32 GiB addresses take 64 bits.
        Life{"huge", BASE, 100 * GIB, 4 * GIB, {0, 4096, GIB, 64 * GIB}, 400, 50'000},
        Life{"endsWhereAddressesEnd", 0 - 64 * KIB, 64 * KIB, KIB, {0, 64, 4096}, 200, 50'000}),
    [](const auto& info) { return std::string(info.param.label); });

TEST(DaFirstFitArena, roundsSizesUpToEight) {
    struct Row {
        Address size;
        Address taken;
    };
    for (const Row row : {Row{0, 8}, Row{1, 8}, Row{8, 8}, Row{9, 16}}) {
        DaFirstFitArena arena(pointerTo(BASE), 64);
        EXPECT_EQ(arena.allocate(row.size), pointerTo(BASE)) << row.size;
        EXPECT_EQ(arena.allocate(row.size), pointerTo(BASE + row.taken)) << row.size;
        EXPECT_EQ(arena.getStatistics().freeBytes, 64 - 2 * row.taken) << row.size;
    }
}

TEST(DaFirstFitArena, keepsWhatAlignmentLeavesOutInFrontFree) {
    DaFirstFitArena arena(pointerTo(BASE), 64);
    EXPECT_EQ(arena.allocate(8), pointerTo(BASE));
    EXPECT_EQ(arena.allocate(48, 16), pointerTo(BASE + 16));
    EXPECT_EQ(freeBlocksOf(arena), (std::vector<std::pair<Address, Address>>{{8, 8}}));
    EXPECT_EQ(arena.allocate(8, 16), nullptr) << "a block of 8 bytes at an odd place";
    EXPECT_EQ(arena.allocate(8, 8), pointerTo(BASE + 8));
    EXPECT_EQ(arena.allocate(1), nullptr);
    EXPECT_EQ(arena.getStatistics().largestFreeBlock, 0u);
}

TEST(DaFirstFitArena, refusesWhatCannotFitHoweverLargeTheNumbers) {
    constexpr Address MAX = ~Address(0);
    for (const Address base : {BASE, BASE + 1, 0 - KIB}) {
        DaFirstFitArena arena(pointerTo(base), KIB);
        for (const Address size : {KIB + 1, MAX / 2 + 1, MAX - 8, MAX - 7, MAX - 6, MAX}) {
            for (const Address alignment : {Address(0), Address(16), MAX / 2 + 1}) {
                EXPECT_EQ(arena.allocate(size, alignment), nullptr) << size << " " << alignment;
            }
        }
        EXPECT_EQ(arena.allocate(8, MAX / 2 + 1), nullptr) << "nothing here is aligned so far";
        EXPECT_EQ(arena.allocate(KIB), pointerTo(base));
        EXPECT_EQ(arena.getStatistics().nbFreeBlocks, 0u);
    }
}

TEST(DaFirstFitArena, findsTheOneAddressThatIsAlignedBeyondItsWords) {
    constexpr Address FAR_APART = Address(1) << 40;
    DaFirstFitArena arena(pointerTo(FAR_APART - 64), 128);
    EXPECT_EQ(arena.allocate(72, FAR_APART), nullptr);
    EXPECT_EQ(arena.allocate(16, FAR_APART), pointerTo(FAR_APART));
    EXPECT_EQ(arena.allocate(16, FAR_APART), nullptr) << "taken";
    EXPECT_EQ(arena.allocate(64), pointerTo(FAR_APART - 64));
    EXPECT_EQ(arena.allocate(48), pointerTo(FAR_APART + 16));
    arena.deallocate(pointerTo(FAR_APART));
    EXPECT_EQ(arena.allocate(24, FAR_APART), nullptr);
    EXPECT_EQ(arena.allocate(16, FAR_APART), pointerTo(FAR_APART));
}

TEST(DaFirstFitArena, joinsABlockWithWhatIsFreeOnEitherSide) {
    for (const std::vector<int>& order :
         {std::vector{1, 0, 2}, {0, 1, 2}, {2, 1, 0}, {0, 2, 1}, {1, 2, 0}}) {
        DaFirstFitArena arena(pointerTo(BASE), 96);
        std::vector<void*> blocks;
        for (int i = 0; i < 3; ++i) blocks.push_back(arena.allocate(32));
        for (const int i : order) arena.deallocate(blocks[static_cast<std::size_t>(i)]);
        EXPECT_EQ(freeBlocksOf(arena), (std::vector<std::pair<Address, Address>>{{0, 96}}));
        EXPECT_EQ(arena.allocate(96), pointerTo(BASE));
    }
}

TEST(DaFirstFitArena, assertsOnAnAddressThatIsNotHandedOut) {
    constexpr const char* TEXT = "blockEntry != _allocatedBlocks.end()";
    for (const Address base : {BASE, BASE + 1}) {
        DaFirstFitArena arena(pointerTo(base), KIB);
        void* const block = arena.allocate(64);
        void* const other = arena.allocate(64);
        arena.deallocate(block);
        for (const Address wrong : {base, base + 8, base + 65, base + 72, base + KIB, base - 8,
                                    base + 64 + (Address(1) << 35), Address(0)}) {
            expectAsserts(TEXT, [&] { arena.deallocate(pointerTo(wrong)); });
        }
        EXPECT_EQ(arena.getStatistics().freeBytes, KIB - 64);
        arena.deallocate(other);
        EXPECT_EQ(freeBlocksOf(arena).size(), 1u);
        try {
            arena.deallocate(other);
            ADD_FAILURE() << "given back twice";
        } catch (const AssertionFailed& failure) {
            EXPECT_STREQ(failure.getFile(), "src/resmgt/daFirstFitArena");
            EXPECT_EQ(failure.getLine(), 185);
        }
    }
}

TEST(DaFirstFitArena, assertsOnAlignmentsAndPlacesThatMakeNoSense) {
    DaFirstFitArena arena(pointerTo(BASE), KIB);
    for (const Address alignment : {Address(3), Address(24), ~Address(0), BASE + 8}) {
        EXPECT_THROW((void)arena.allocate(8, alignment), AssertionFailed) << alignment;
    }
    EXPECT_EQ(arena.getStatistics().nbAllocatedBlocks, 0u);
    expectAsserts("base != nullptr", [] { DaFirstFitArena(nullptr, 64); });
    expectAsserts("size > 0", [] { DaFirstFitArena(pointerTo(BASE), 0); });
    expectAsserts("base + size <= 2^64", [] { DaFirstFitArena(pointerTo(~Address(63)), 72); });
}

/// An arena of blocks of 24 bytes side by side, and its model.
struct Filled {
    explicit Filled(std::size_t nbBlocks) : arena(pointerTo(BASE), GIB), model(BASE, GIB) {
        for (std::size_t i = 0; i < nbBlocks; ++i) {
            blocks.push_back(model.allocate(24, 0));
            EXPECT_EQ(arena.allocate(24), pointerTo(blocks.back()));
        }
    }

    DaFirstFitArena arena;
    Model model;
    std::vector<Address> blocks;
};

TEST(DaFirstFitArena, isUnchangedWhenItsBooksFindNoMemory) {
    // Numbers of blocks at which one book or the other is about to grow, among others.
    for (std::size_t nbBlocks = 0; nbBlocks < 400; ++nbBlocks) {
        for (const Address alignment : {Address(0), Address(64)}) {
            Filled filled(nbBlocks);
            void* block = nullptr;
            std::uint32_t nbGranted = 0;
            for (bool isDone = false; !isDone; ++nbGranted) {
                try {
                    const HmHeapMgr::Shortage shortage(nbGranted);
                    block = filled.arena.allocate(40, alignment);
                    isDone = true;
                } catch (const std::bad_alloc&) {
                }
                if (!isDone) expectSame(filled.arena, filled.model, BASE);
            }
            EXPECT_EQ(block, pointerTo(filled.model.allocate(40, alignment)));
            expectSame(filled.arena, filled.model, BASE);
            if (HasFailure()) return;
        }
    }
}

TEST(DaFirstFitArena, findsNoMemoryOnTheWayUpAtEveryAllocationInTurn) {
    // The other way round: from an empty arena on, every request of its books refused once.
    DaFirstFitArena arena(pointerTo(BASE), GIB);
    std::size_t nbRefused = 0;
    for (Address i = 0; i < 20'000; ++i) {
        for (std::uint32_t nbGranted = 0;; ++nbGranted) {
            try {
                const HmHeapMgr::Shortage shortage(nbGranted);
                ASSERT_EQ(arena.allocate(8), pointerTo(BASE + 8 * i));
                break;
            } catch (const std::bad_alloc&) {
                ++nbRefused;
            }
        }
    }
    EXPECT_GT(nbRefused, 20u);
    EXPECT_LT(nbRefused, 400u) << "the books grow by small steps";
    EXPECT_EQ(arena.getStatistics().nbAllocatedBlocks, 20'000u);
}

TEST(DaFirstFitArena, takesBlocksBackWithoutAskingForMemory) {
    for (const std::size_t nbBlocks : {1u, 2u, 11u, 33u, 100u, 1001u, 20'000u}) {
        Filled filled(nbBlocks);
        {
            // Every other one first: each then makes a free block of its own.
            const HmHeapMgr::Shortage shortage(0);
            for (std::size_t i = 0; i < nbBlocks; i += 2) {
                filled.arena.deallocate(pointerTo(filled.blocks[i]));
            }
        }
        for (std::size_t i = 0; i < nbBlocks; i += 2) filled.model.deallocate(filled.blocks[i]);
        expectSame(filled.arena, filled.model, BASE);
        for (std::size_t i = 1; i < nbBlocks; i += 2) {
            filled.arena.deallocate(pointerTo(filled.blocks[i]));
        }
        EXPECT_EQ(freeBlocksOf(filled.arena).size(), 1u);
    }
}

TEST(DaFirstFitArena, needsNoMemoryOnceItHasHeldAsManyBlocks) {
    DaFirstFitArena arena(pointerTo(BASE), GIB);
    std::vector<void*> blocks;
    for (int i = 0; i < 5000; ++i) blocks.push_back(arena.allocate(64, 16));
    std::mt19937 random(3);
    const HmHeapMgr::Shortage shortage(0);
    for (int i = 0; i < 100'000; ++i) {
        void*& block = blocks[random() % blocks.size()];
        arena.deallocate(block);
        ASSERT_NO_THROW(block = arena.allocate(1 + random() % 4096, 16));
    }
    EXPECT_EQ(arena.getStatistics().nbAllocatedBlocks, 5000u);
}

TEST(DaFirstFitArena, leavesNoMemoryBehind) {
    const HmHeapMgr::Usage before = HmHeapMgr::getUsage();
    {
        const Filled filled(1000);
        EXPECT_GT(HmHeapMgr::getUsage().bytes, before.bytes);
    }
    EXPECT_EQ(HmHeapMgr::getUsage().blocks, before.blocks);
    EXPECT_EQ(HmHeapMgr::getUsage().bytes, before.bytes);
}

TEST(DaFirstFitArena, dumpsSizeBlocksAndFragmentationWhateverTheStreamIsSetTo) {
    DaFirstFitArena arena(pointerTo(BASE), 4096, "frames");
    (void)arena.allocate(100);
    (void)arena.allocate(16, 1024);
    std::ostringstream stream;
    stream << std::hex << std::showbase;
    arena.dump(stream);
    arena.dumpFreeBlocks(stream);
    EXPECT_EQ(stream.str(),
              "Arena: frames 4096 bytes\n"
              "  nb alloc blk : 2\n"
              "  nb free blk  : 2\n"
              "  free bytes   : 3976\n"
              "  largest free : 3056\n"
              "Arena: frames\n"
              "  free block map:\n"
              "         104       920\n"
              "        1040      3056\n");
    EXPECT_STREQ(DaFirstFitArena(pointerTo(BASE), 8).getName(), "<Unnamed arena>");
}

}  // namespace

}  // namespace Orv
