#include <gtest/gtest.h>
#include <limits>

#include "lkCounter.h"

namespace Orv {

namespace {

constexpr long MAXIMUM = std::numeric_limits<std::int32_t>::max();
constexpr long MINIMUM = std::numeric_limits<std::int32_t>::min();

TEST(LkCounter, prefixAndCompoundFormsGiveTheNewValueAndPostfixFormsTheOld) {
    LkCounter<long> counter(5);
    EXPECT_EQ(++counter, 6);
    EXPECT_EQ(counter++, 6);
    EXPECT_EQ(counter.getValue(), 7);
    EXPECT_EQ(--counter, 6);
    EXPECT_EQ(counter--, 6);
    EXPECT_EQ(counter += 10, 15);
    EXPECT_EQ(counter -= 20, -5);
    EXPECT_EQ(counter = 3, 3);
    EXPECT_EQ(counter.getValue(), 3);
}

TEST(LkCounter, is32BitsWideAndWraps) {
    LkCounter<long> counter(MAXIMUM);
    EXPECT_EQ(++counter, MINIMUM);
    EXPECT_EQ(--counter, MAXIMUM);
    EXPECT_EQ(counter += 2, MINIMUM + 1);
    EXPECT_EQ(counter -= 2, MAXIMUM);
    EXPECT_EQ(counter++, MAXIMUM);
    EXPECT_EQ(counter--, MINIMUM);
}

TEST(LkCounter, losesNoChangeOfAnyThread) {
    constexpr int NB_ROUNDS = 20000;
    LkCounter<long> counter(0);
    std::atomic<int> nbZeroes{0};
    std::vector<std::jthread> threads;
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([&] {
            for (int round = 0; round < NB_ROUNDS; ++round) {
                ++counter;
                counter += 2;
                counter++;
                --counter;
                counter -= 1;
                counter--;
            }
        });
    }
    threads.clear();
    EXPECT_EQ(counter.getValue(), 4 * NB_ROUNDS);

    // Of all who count down, exactly one sees zero.
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([&] {
            for (int round = 0; round < NB_ROUNDS; ++round) {
                if (--counter == 0) ++nbZeroes;
            }
        });
    }
    threads.clear();
    EXPECT_EQ(nbZeroes, 1);
}

}  // namespace

}  // namespace Orv
