// A singleton that two libraries of a process ask for.
#include <gtest/gtest.h>
#include <thread>
#include <vector>

#include "otherLibrary/otherLibrary.h"

namespace Orv {

namespace {

TEST(Library, givesTheProgramAndAnotherLibraryTheSameSingleton) {
    constexpr int NB_THREADS = 8;
    std::atomic<int> nbReady{0};
    std::vector<std::thread> threads;
    for (int i = 0; i < NB_THREADS; ++i) {
        threads.emplace_back([&nbReady, i] {
            // All ask for the first time at once.
            for (++nbReady; nbReady.load() != NB_THREADS;) std::this_thread::yield();
            SharedTable& table =
                i % 2 == 0 ? getTableOfOtherLibrary() : LkSingleton<SharedTable>::getInstance();
            ++table.nbEntries;
        });
    }
    for (std::thread& thread : threads) thread.join();
    EXPECT_EQ(getTableOfOtherLibrary().nbEntries.load(), NB_THREADS);
    EXPECT_EQ(&getTableOfOtherLibrary(), &LkSingleton<SharedTable>::getInstance());
}

}  // namespace

}  // namespace Orv
