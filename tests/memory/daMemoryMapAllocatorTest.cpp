#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <cstring>
#include <gtest/gtest.h>
#include <random>
#include <thread>
#include <vector>

#include "daMemoryMapAllocator.h"
#include "exSysError.h"
#include "expectThrows.h"

namespace Orv {

namespace {

constexpr std::uint64_t SIZE = 100'000;

using Allocator = ObjPtr<DaMemoryMapAllocator>;

/// A name that no other run of the program uses, but the processes that this one starts.
std::string ownName(const char* suffix) {
    static const std::string prefix = [] {
        constexpr const char* VARIABLE = "ORV_DA_TEST_RUN";
        if (const char* const given = std::getenv(VARIABLE)) return std::string(given);
        std::string made = "daTest." + std::to_string(std::random_device{}()) + ".";
#if defined(_WIN32)
        _putenv_s(VARIABLE, made.c_str());
#else
        ::setenv(VARIABLE, made.c_str(), 1);
#endif
        return made;
    }();
    return prefix + suffix;
}

Allocator open(const std::string& name) {
    return DaMemoryMapAllocator::create(name.c_str());
}

char* map(Allocator& allocator, std::uint64_t size) {
    return static_cast<char*>(allocator->allocate(size));
}

bool isZero(const char* memory, std::uint64_t size) {
    return std::all_of(memory, memory + size, [](char byte) { return byte == 0; });
}

TEST(DaMemoryMapAllocator, givesTheSameMemoryUnderTheSameNameOnly) {
    Allocator first = open(ownName("a/b"));
    Allocator second = open(ownName("a\\b"));
    Allocator encoded = open(ownName("a%2Fb"));
    Allocator longer = open(ownName("a/b "));
    char* const memory = map(first, SIZE);
    EXPECT_TRUE(isZero(memory, SIZE));
    std::memset(memory, 'x', SIZE);
    EXPECT_EQ(std::memcmp(map(second, SIZE / 2), memory, SIZE / 2), 0);
    EXPECT_TRUE(isZero(map(encoded, SIZE), SIZE));
    EXPECT_TRUE(isZero(map(longer, SIZE), SIZE));
}

TEST(DaMemoryMapAllocator, startsAfreshOnceTheLastUserHasLeft) {
    Allocator first = open(ownName("fresh"));
    Allocator second = open(ownName("fresh"));
    char* const memory = map(first, SIZE);
    std::memset(memory, 'x', SIZE);
    char* const shared = map(second, SIZE);
    first->deallocate(memory, SIZE);
    EXPECT_EQ(shared[SIZE - 1], 'x') << "the second user still has it";
    second.reset();
    EXPECT_TRUE(isZero(map(first, 3 * SIZE), 3 * SIZE));
}

TEST(DaMemoryMapAllocator, refusesToMapMoreThanThereIsAndLeavesItAlone) {
    Allocator first = open(ownName("small"));
    Allocator second = open(ownName("small"));
    char* const memory = map(first, SIZE);
    memory[0] = 'x';
    EXPECT_THROW((void)second->allocate(100 * SIZE), ExSysError);
    EXPECT_EQ(memory[0], 'x');
    EXPECT_EQ(map(second, SIZE)[0], 'x') << "the allocator works after a failure";
}

TEST(DaMemoryMapAllocator, leavesNothingBehindWhenTheSystemHasNotEnough) {
    Allocator allocator = open(ownName("large"));
    for (const std::uint64_t size : {std::uint64_t(1) << 62, ~std::uint64_t(0)}) {
        try {
            (void)allocator->allocate(size);
            ADD_FAILURE() << "got " << size << " bytes";
        } catch (const ExSysError& error) {
            EXPECT_NE(error.getOsError(), 0);
        }
        char* const memory = map(allocator, SIZE);
        EXPECT_TRUE(isZero(memory, SIZE));
        allocator->deallocate(memory, SIZE);
    }
}

TEST(DaMemoryMapAllocator, takesHugePagesOrNormalOnesWhenThatIsAllowed) {
    Allocator allocator =
        DaMemoryMapAllocator::create(ownName("huge").c_str(), DaPages::HUGE_IF_OFFERED);
    constexpr std::uint64_t LARGE = (std::uint64_t(5) << 20) + 1;
    char* const memory = map(allocator, LARGE);
    std::memset(memory, 'x', LARGE);
    Allocator normal = open(ownName("huge"));
    EXPECT_EQ(map(normal, LARGE)[LARGE - 1], 'x');
}

TEST(DaMemoryMapAllocator, assertsOnMisuse) {
    EXPECT_THROW((void)DaMemoryMapAllocator::create(nullptr), AssertionFailed);
    EXPECT_THROW((void)DaMemoryMapAllocator::create(""), AssertionFailed);
    Allocator allocator = open(ownName("misuse"));
    EXPECT_THROW((void)allocator->allocate(0), AssertionFailed);
    char* const memory = map(allocator, SIZE);
    EXPECT_THROW((void)allocator->allocate(SIZE), AssertionFailed);
    EXPECT_THROW(allocator->deallocate(memory + 8, SIZE), AssertionFailed);
    allocator->deallocate(nullptr, 0);
    memory[SIZE - 1] = 'x';  // is still there
    allocator->deallocate(memory, SIZE);
    EXPECT_THROW(allocator->deallocate(memory, SIZE), AssertionFailed);
}

/// Each user writes a mark of its own and must find it until it leaves: memory that is made anew
/// or removed under a user would lose it.
TEST(DaMemoryMapAllocator, neverTakesMemoryFromAUserWhileOthersComeAndGo) {
    constexpr unsigned NB_USERS = 4;
    constexpr int NB_ROUNDS = 400;
    std::atomic<int> nbLost{0};
    std::atomic<int> nbShared{0};
    std::vector<std::jthread> users;
    for (unsigned user = 0; user < NB_USERS; ++user) {
        users.emplace_back([&, user] {
            Allocator allocator = open(ownName("race"));
            for (int round = 1; round <= NB_ROUNDS; ++round) {
                auto* const marks = static_cast<std::atomic<int>*>(
                    allocator->allocate(NB_USERS * sizeof(std::atomic<int>)));
                marks[user] = round;
                std::this_thread::yield();
                for (unsigned other = 0; other < NB_USERS; ++other) {
                    if (other != user && marks[other] != 0) ++nbShared;
                }
                if (marks[user] != round) ++nbLost;
                marks[user] = 0;
                allocator->deallocate(marks, NB_USERS * sizeof(std::atomic<int>));
            }
        });
    }
    users.clear();
    EXPECT_EQ(nbLost, 0);
    EXPECT_GT(nbShared, 0) << "they never met";
    Allocator last = open(ownName("race"));
    EXPECT_TRUE(isZero(map(last, SIZE), SIZE)) << "the name is still in use";
}

// A death test runs the program once more, up to its statement, which only the new process runs.

TEST(DaMemoryMapAllocatorDeathTest, sharesMemoryWithAnotherProcess) {
    Allocator allocator = open(ownName("processes"));
    char* const memory = map(allocator, SIZE);
    const bool isFirst = memory[0] == 0;
    if (isFirst) std::memset(memory, 'p', SIZE);
    const auto answer = [&] {
        if (isFirst) std::_Exit(2);
        if (memory[SIZE - 1] != 'p') std::_Exit(3);
        std::memset(memory, 'c', SIZE);
        std::_Exit(0);
    };
    EXPECT_EXIT(answer(), testing::ExitedWithCode(0), "");
    EXPECT_EQ(std::count(memory, memory + SIZE, 'c'), static_cast<std::ptrdiff_t>(SIZE));
}

TEST(DaMemoryMapAllocatorDeathTest, startsAfreshAfterAProcessThatDidNotTidyUp) {
    const auto die = [] {
        Allocator allocator = open(ownName("stale"));
        std::memset(map(allocator, SIZE), 'x', SIZE);
        std::_Exit(0);
    };
    EXPECT_EXIT(die(), testing::ExitedWithCode(0), "");
    Allocator allocator = open(ownName("stale"));
    EXPECT_TRUE(isZero(map(allocator, 5 * SIZE), 5 * SIZE));
}

}  // namespace

}  // namespace Orv
