#include <algorithm>
#include <cmath>

#include "rnNumRecUniformRng.h"

namespace Orv {

namespace {

using Generator = RnNumRecUniformRng<double>;

// Computed in Python, whose numbers have no width, from the published recurrences: the upper 53
// bits of each word.
TEST(RnNumRecUniformRng, givesThePublishedSequenceOnEveryPlatform) {
    struct Row {
        std::uint64_t seed;
        std::uint64_t expected[4];
    };
    const Row rows[] = {
        {1U, {6331357011769570U, 4687676335253193U, 5171084433360200U, 3524774692670676U}},
        {0U, {5415695640260286U, 6735350249106120U, 927921571702396U, 3752300831360421U}},
        {1234567U, {1711339255655424U, 888456430154533U, 610767258815931U, 8271597497607418U}},
        {18446744073709551615U,
         {5043065146658773U, 6912440677258288U, 4569322158181384U, 6734172366359527U}},
    };
    for (const Row& row : rows) {
        Generator generator(row.seed);
        for (const std::uint64_t expected : row.expected) {
            EXPECT_EQ(generator.next() * 0x1p53, static_cast<double>(expected)) << row.seed;
        }
    }
}

TEST(RnNumRecUniformRng, aSeedStartsItsSequenceAgain) {
    Generator generator;
    Generator other(Generator::DEFAULT_SEED + 1);
    const double first = generator.next();
    EXPECT_NE(other.next(), first);
    other.setSeed(Generator::DEFAULT_SEED);
    EXPECT_EQ(other.next(), first);
}

// The sequences are fixed, so these bounds hold always or never.
TEST(RnNumRecUniformRng, spreadsEvenlyAndNeverReachesOne) {
    constexpr int CELLS = 100;
    constexpr int NUMBERS = 1'000'000;
    for (const std::uint64_t seed : {0ULL, 1ULL, 2ULL, 0xffffffffffffffffULL}) {
        Generator generator(seed);
        std::vector<double> counts(CELLS), pairCounts(CELLS);
        double previous = generator.next();
        double sumOfProducts = 0.0;
        for (int i = 0; i < NUMBERS; ++i) {
            const double number = generator.next();
            ASSERT_GE(number, 0.0);
            ASSERT_LT(number, 1.0);
            ++counts[static_cast<std::size_t>(number * CELLS)];
            ++pairCounts[static_cast<std::size_t>(number * 10) * 10 +
                         static_cast<std::size_t>(previous * 10)];
            sumOfProducts += (number - 0.5) * (previous - 0.5);
            previous = number;
        }
        const auto chiSquare = [](const std::vector<double>& observed) {
            constexpr double EXPECTED = static_cast<double>(NUMBERS) / CELLS;
            double sum = 0.0;
            for (const double count : observed) sum += (count - EXPECTED) * (count - EXPECTED);
            return sum / EXPECTED;
        };
        // 99 degrees of freedom: 99.9 % of good generators stay between 60 and 149.
        EXPECT_GT(chiSquare(counts), 60.0) << seed;
        EXPECT_LT(chiSquare(counts), 149.0) << seed;
        EXPECT_LT(chiSquare(pairCounts), 149.0) << seed;
        EXPECT_LT(std::abs(sumOfProducts / NUMBERS * 12), 4e-3) << seed;  // correlation, 4 sigma
    }
}

}  // namespace

}  // namespace Orv
