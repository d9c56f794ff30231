#include <gtest/gtest.h>
#include <thread>

#include "lkAdaptiveWait.h"

namespace Orv {

namespace {

/// How many of a number of waits look at all, if each look has the given outcome.
int countLooks(LkAdaptiveWait& wait, int nbWaits, bool paysOff) {
    int nbLooks = 0;
    for (int i = 0; i < nbWaits; ++i) {
        bool hasLooked = false;
        wait.look([&] {
            hasLooked = true;
            return paysOff;
        });
        nbLooks += hasLooked;
    }
    return nbLooks;
}

// On threads of their own, which have no experience yet.

TEST(LkAdaptiveWait, looksWhereThatPaysOffAndElseOnlyProbesEverMoreRarely) {
    if (!LkAdaptiveWait::mayLook()) GTEST_SKIP() << "this process may use only one processor";
    std::jthread([] {
        LkAdaptiveWait wait;
        EXPECT_EQ(countLooks(wait, 50, true), 50);
        EXPECT_LE(countLooks(wait, 1000, false), 16);  // gives up, then probes
        countLooks(wait, 4000, false);
        EXPECT_LE(countLooks(wait, 8000, false), 4);
        // When the partner has become quick, a probe finds out, and looking is back.
        countLooks(wait, 10000, true);
        EXPECT_EQ(countLooks(wait, 50, true), 50);
    }).join();
}

TEST(LkAdaptiveWait, newObjectsStartFromTheExperienceOfTheThread) {
    if (!LkAdaptiveWait::mayLook()) GTEST_SKIP() << "this process may use only one processor";
    std::jthread([] {
        int nbLooks = 0;
        for (int i = 0; i < 200; ++i) {
            LkAdaptiveWait used;  // such as the semaphore of a single request
            nbLooks += countLooks(used, 1, false);
        }
        EXPECT_LE(nbLooks, 20);
        for (int i = 0; i < 5000; ++i) {
            LkAdaptiveWait used;
            countLooks(used, 1, true);
        }
        LkAdaptiveWait next;
        EXPECT_EQ(countLooks(next, 1, true), 1);
    }).join();
}

TEST(LkAdaptiveWait, aLookIsBounded) {
    const auto start = std::chrono::steady_clock::now();
    std::uint64_t nbRounds = 0;
    for (LkAdaptiveWait::Look look; look.goesOn();) ++nbRounds;
    EXPECT_GE(std::chrono::steady_clock::now() - start, LkAdaptiveWait::LONGEST_LOOK);
    // The processor pauses in each round, so there cannot be many in so short a time.
    EXPECT_LT(nbRounds, 100000U);
}

}  // namespace

}  // namespace Orv
