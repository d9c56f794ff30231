#include <limits>

#include "rational.h"
#include "rationalEx.h"

namespace Orv {

namespace {

constexpr std::int64_t MAX = std::numeric_limits<std::int64_t>::max();
constexpr std::int64_t MIN = std::numeric_limits<std::int64_t>::min();

std::string textOf(const Rational& value) {
    std::ostringstream text;
    text << value;
    return text.str();
}

TEST(Rational, isAlwaysReducedWithAPositiveDenominator) {
    struct Row {
        std::int64_t numerator, denominator;
        const char* expected;
    };
    const Row rows[] = {
        {2997, 100, "2997/100"},
        {30000, 1001, "30000/1001"},
        {50, 100, "1/2"},
        {-50, 100, "-1/2"},
        {50, -100, "-1/2"},
        {-50, -100, "1/2"},
        {0, -7, "0/1"},
        {0, MIN, "0/1"},
        {MIN, MIN, "1/1"},
        {MIN, 2, "-4611686018427387904/1"},
        {2, MIN, "-1/4611686018427387904"},
        {MAX, MAX, "1/1"},
        {MIN, 1, "-9223372036854775808/1"},
    };
    for (const Row& row : rows) {
        EXPECT_EQ(textOf(Rational(row.numerator, row.denominator)), row.expected)
            << row.numerator << " by " << row.denominator;
    }
}

TEST(Rational, calculatesExactlyWhereOnlyTheReducedResultFits) {
    EXPECT_EQ(Rational(1, 3) + Rational(1, 6), Rational(1, 2));
    EXPECT_EQ(Rational(1, 3) - Rational(1, 2), Rational(-1, 6));
    EXPECT_EQ(Rational(2, 3) / Rational(-4, 9), Rational(-3, 2));
    EXPECT_EQ(Rational(MAX, 2) * Rational(2, MAX), Rational(1));
    EXPECT_EQ(Rational(1, MAX) + Rational(-1, MAX), Rational());
    EXPECT_EQ(Rational(MIN) + Rational(MAX), Rational(-1));
    EXPECT_EQ(Rational(MIN) / Rational(MIN), Rational(1));
    EXPECT_EQ(-Rational(3, 4), Rational(-3, 4));
    EXPECT_DOUBLE_EQ(Rational(30000, 1001).toDouble(), 30000.0 / 1001.0);
    Rational value(3, 4);
    value += value;
    EXPECT_EQ(value, Rational(3, 2));
    value /= value;
    EXPECT_EQ(value, Rational(1));
}

TEST(Rational, comparesExactlyWhereDoublesAreEqual) {
    const Rational a(MAX - 1, MAX);
    const Rational b(MAX - 2, MAX - 1);
    ASSERT_EQ(a.toDouble(), b.toDouble());
    EXPECT_GT(a, b);
    EXPECT_NE(a, b);
    EXPECT_LT(Rational(MIN), Rational(MIN, MAX));
    EXPECT_LT(Rational(-1, 2), Rational(-1, 3));
}

TEST(Rational, refusesWhatDoesNotFitAndLeavesTheOperand) {
    EXPECT_THROW(Rational(1, 0), RationalEx::ExDivisionByZero);
    EXPECT_THROW(Rational(0, 0), std::domain_error);
    EXPECT_THROW(Rational(1) / Rational(), RationalEx);
    EXPECT_THROW(Rational(MIN, -1), RationalEx::ExOverflow);
    EXPECT_THROW(Rational(1, MIN), std::overflow_error);
    EXPECT_THROW(-Rational(MIN), RationalEx::ExOverflow);
    EXPECT_THROW(Rational(1, MAX) * Rational(1, 2), RationalEx::ExOverflow);
    EXPECT_THROW(Rational(1, MAX) - Rational(1, MAX - 1), RationalEx::ExOverflow);
    Rational value(MAX);
    EXPECT_THROW(value += 1, RationalEx::ExOverflow);
    EXPECT_THROW(value *= 2, RationalEx::ExOverflow);
    EXPECT_THROW(value /= 0, RationalEx::ExDivisionByZero);
    EXPECT_EQ(value, Rational(MAX));
}

}  // namespace

}  // namespace Orv
