#include <algorithm>
#include <gtest/gtest.h>
#include <limits>
#include <random>

#include "prioritySolver.h"
#include "solverProblem.h"

namespace Orv {

namespace {

using Index = PrioritySolver::Index;
using Numbers = SolverProblem::Numbers;

constexpr auto derived = std::nullopt;
constexpr auto EQUAL = SolverProblem::EQUAL;
constexpr auto LESS = SolverProblem::LESS;
constexpr auto LESS_EQUAL = SolverProblem::LESS_EQUAL;

Numbers numbersOf(const PrioritySolver& solver, std::size_t size) {
    Numbers numbers;
    for (Index i = 0; i < size; ++i) numbers.push_back(solver.getNumber(i));
    return numbers;
}

/// Compares with what trying out everything finds: feasibility, bounds and packed numbers.
void expectAsByTrying(const SolverProblem& problem) {
    const std::vector<Numbers> solutions = problem.findAllSolutions();
    PrioritySolver solver = problem.makeSolver();
    const PrioritySolver::Outcome outcome = solver.solve();
    ASSERT_EQ(outcome == PrioritySolver::SOLVED, !solutions.empty()) << problem;
    if (outcome == PrioritySolver::EMPTY_RANGE) {
        const Index culprit = solver.getCulprit();
        ASSERT_FALSE(problem.priorities[culprit]) << problem;
        ASSERT_GT(solver.getLow(culprit), solver.getHigh(culprit)) << problem;
    } else if (outcome == PrioritySolver::BROKEN_RELATION) {
        const Numbers numbers = numbersOf(solver, problem.priorities.size());
        const auto& relations = problem.relations;
        const auto broken = std::find_if(
            relations.begin(), relations.end(),
            [&](const SolverProblem::Relation& r) { return !problem.holds(r, numbers); });
        ASSERT_EQ(broken - relations.begin(), solver.getCulprit()) << problem;
    } else {
        ASSERT_EQ(numbersOf(solver, problem.priorities.size()), problem.pack(solutions)) << problem;
        for (Index i = 0; i < problem.priorities.size(); ++i) {
            const auto [lowest, highest] = std::minmax_element(
                solutions.begin(), solutions.end(),
                [&](const Numbers& a, const Numbers& b) { return a[i] < b[i]; });
            ASSERT_EQ(solver.getLow(i), (*lowest)[i]) << problem;
            ASSERT_EQ(solver.getHigh(i), (*highest)[i]) << problem;
        }
    }
}

/// Every problem with one of the relations none, ==, <, <=, > and >= between each two priorities.
void expectAllRelationsAsByTrying(SolverProblem problem) {
    std::vector<std::pair<std::size_t, std::size_t>> pairs;
    std::size_t nbProblems = 1;
    for (std::size_t rhs = 0; rhs < problem.priorities.size(); ++rhs) {
        for (std::size_t lhs = 0; lhs < rhs; ++lhs) {
            pairs.emplace_back(lhs, rhs);
            nbProblems *= 6;
        }
    }
    for (std::size_t code = 0; code < nbProblems; ++code) {
        problem.relations.clear();
        std::size_t rest = code;
        for (const auto& [lhs, rhs] : pairs) {
            const std::size_t choice = rest % 6;
            rest /= 6;
            if (choice == 0) continue;
            if (choice < 4)
                problem.relations.push_back({lhs, SolverProblem::Kind(choice - 1), rhs});
            if (choice > 3)
                problem.relations.push_back({rhs, SolverProblem::Kind(choice - 3), lhs});
        }
        expectAsByTrying(problem);
        if (testing::Test::HasFatalFailure()) return;
    }
}

TEST(PrioritySolver, decidesEveryGraphOfThreeAsTryingDoes) {
    // Outside the range (-2 and 5) as well as at its ends.
    const std::vector<std::optional<int>> choices = {derived, 0, 2, 3, -2, 5};
    for (const auto& a : choices) {
        for (const auto& b : choices) {
            for (const auto& c : {choices[0], choices[2]}) {
                expectAllRelationsAsByTrying({0, 3, {a, b, c}, {}});
            }
        }
    }
}

TEST(PrioritySolver, decidesEveryGraphOfFourAsTryingDoes) {
    expectAllRelationsAsByTrying({0, 2, {derived, derived, derived, derived}, {}});
    expectAllRelationsAsByTrying({0, 3, {derived, 1, derived, derived}, {}});
    expectAllRelationsAsByTrying({0, 3, {0, derived, derived, 3}, {}});
}

TEST(PrioritySolver, decidesRandomGraphsAsTryingDoes) {
    std::mt19937 random(1);
    const auto pick = [&](std::size_t count) { return random() % count; };
    for (int round = 0; round < 3000; ++round) {
        SolverProblem problem{-2, 2, {}, {}};
        const std::size_t size = 1 + pick(7);
        for (std::size_t i = 0; i < size; ++i) {
            const auto number = static_cast<int>(pick(7)) - 3;
            problem.priorities.push_back(pick(5) == 0 ? std::optional(number) : derived);
        }
        // Repeated ones, both ways between two, and of one with itself are among them.
        for (std::size_t nb = pick(2 * size + 1); nb > 0; --nb) {
            problem.relations.push_back({pick(size), SolverProblem::Kind(pick(3)), pick(size)});
        }
        expectAsByTrying(problem);
        if (HasFatalFailure()) return;
    }
}

TEST(PrioritySolver, packs) {
    struct Row {
        int line;
        SolverProblem problem;
        Numbers numbers;
    };
    const Row rows[] = {
        // Tied to nothing fixed: up from the beginning of the range.
        {__LINE__, {0, 31, {derived, derived}, {{0, LESS, 1}}}, {0, 1}},
        {__LINE__,
         {7, 9, {derived, derived, derived}, {{2, LESS, 1}, {1, LESS_EQUAL, 0}}},
         {8, 8, 7}},
        {__LINE__, {5, 5, {derived}, {}}, {5}},
        // A redundant relation changes nothing.
        {__LINE__,
         {0, 31, {derived, derived, derived}, {{0, LESS, 1}, {0, LESS, 2}, {2, LESS, 1}}},
         {0, 2, 1}},
        // Next to a fixed one, on the side on which the relation puts it.
        {__LINE__, {0, 31, {derived, 10}, {{0, EQUAL, 1}}}, {10, 10}},
        {__LINE__, {0, 31, {derived, 10}, {{0, LESS, 1}}}, {9, 10}},
        {__LINE__, {0, 31, {derived, 10}, {{1, LESS, 0}}}, {11, 10}},
        {__LINE__, {0, 31, {derived, 10}, {{1, LESS_EQUAL, 0}}}, {10, 10}},
        // Between two fixed ones: below the upper one.
        {__LINE__,
         {0, 31, {10, derived, derived, 20}, {{0, LESS, 1}, {1, LESS, 2}, {2, LESS, 3}}},
         {10, 18, 19, 20}},
        // Away from the fixed one and back: 3 stands above 2, which stands below the fixed one.
        {__LINE__,
         {0, 31, {10, derived, derived, derived}, {{1, LESS, 0}, {2, LESS, 1}, {2, LESS, 3}}},
         {10, 9, 8, 9}},
        // The end of the range pushes from beyond the fixed one.
        {__LINE__, {0, 11, {10, derived, derived}, {{1, LESS, 0}, {1, LESS, 2}}}, {10, 9, 10}},
        {__LINE__, {0, 9, {20, derived, derived}, {{1, LESS, 0}, {1, LESS, 2}}}, {20, 8, 9}},
    };
    for (const Row& row : rows) {
        PrioritySolver solver = row.problem.makeSolver();
        ASSERT_EQ(solver.solve(), PrioritySolver::SOLVED) << "line " << row.line;
        EXPECT_EQ(numbersOf(solver, row.numbers.size()), row.numbers) << "line " << row.line;
    }
}

TEST(PrioritySolver, namesTheFirstCulpritAndItsRange) {
    constexpr int INT_LIMIT = std::numeric_limits<int>::max();
    struct Row {
        int line;
        SolverProblem problem;
        Index culprit;
        std::int64_t low, high;
    };
    const Row rows[] = {
        {__LINE__, {0, 31, {derived, 10, 11}, {{1, LESS, 0}, {0, LESS, 2}}}, 0, 11, 10},
        {__LINE__, {0, 31, {10, 11, derived}, {{0, EQUAL, 2}, {2, EQUAL, 1}}}, 2, 11, 10},
        {__LINE__, {0, 31, {derived, 40}, {{0, EQUAL, 1}}}, 0, 40, 31},
        {__LINE__, {0, 31, {derived, 0}, {{0, LESS, 1}}}, 0, 0, -1},
        // A chain longer than the range: each of it has too little room.
        {__LINE__, {0, 1, {5, derived, derived, derived}, {{3, LESS, 2}, {2, LESS, 1}}}, 1, 2, 1},
        // The contradiction is at 1; what hangs below it is not blamed.
        {__LINE__,
         {0,
          31,
          {derived, derived, 9, 9, 3},
          {{0, LESS, 1}, {2, LESS, 1}, {1, LESS, 3}, {4, LESS, 0}}},
         1,
         10,
         8},
        {__LINE__, {3, 2, {derived}, {}}, 0, 3, 2},
        {__LINE__,
         {INT_LIMIT, INT_LIMIT, {derived, INT_LIMIT}, {{1, LESS, 0}}},
         0,
         std::int64_t{INT_LIMIT} + 1,
         INT_LIMIT},
    };
    for (const Row& row : rows) {
        PrioritySolver solver = row.problem.makeSolver();
        ASSERT_EQ(solver.solve(), PrioritySolver::EMPTY_RANGE) << "line " << row.line;
        EXPECT_EQ(solver.getCulprit(), row.culprit) << "line " << row.line;
        EXPECT_EQ(solver.getLow(row.culprit), row.low) << "line " << row.line;
        EXPECT_EQ(solver.getHigh(row.culprit), row.high) << "line " << row.line;
    }
}

TEST(PrioritySolver, tellsWhoIsTiedToAFixedPriority) {
    PrioritySolver solver(0, 31);
    const Index fixed = solver.addFixed(3), below = solver.addDerived(),
                beside = solver.addDerived();
    const Index alone = solver.addDerived(), pair = solver.addDerived(),
                other = solver.addDerived();
    solver.addLess(below, fixed);
    solver.addLess(below, beside);
    solver.addEqual(pair, other);
    ASSERT_EQ(solver.solve(), PrioritySolver::SOLVED);
    EXPECT_TRUE(solver.isTied(fixed) && solver.isTied(below) && solver.isTied(beside));
    EXPECT_FALSE(solver.isTied(alone) || solver.isTied(pair) || solver.isTied(other));
}

TEST(PrioritySolver, solvesLongChainsWithoutDeepRecursion) {
    constexpr Index size = 100'000;
    // The middle one is fixed; from bottom to top, and added the other way round.
    for (const bool isReversed : {false, true}) {
        PrioritySolver solver(0, 2 * size);
        for (Index i = 0; i < size; ++i)
            i == size / 2 ? solver.addFixed(60'000) : solver.addDerived();
        for (Index i = 1; i < size; ++i) {
            const Index upper = isReversed ? size - i : i;
            solver.addLess(upper - 1, upper);
        }
        ASSERT_EQ(solver.solve(), PrioritySolver::SOLVED);
        for (Index i = 0; i < size; ++i)
            ASSERT_EQ(solver.getNumber(i), static_cast<int>(i) + 10'000);

        // Closed to a circle, it contradicts itself; a circle of <= does not.
        solver.addLess(size - 1, 0);
        EXPECT_NE(solver.solve(), PrioritySolver::SOLVED);
    }
    PrioritySolver circle(0, 0);
    for (Index i = 0; i < size; ++i) circle.addDerived();
    for (Index i = 0; i < size; ++i) circle.addLessOrEqual(i, (i + 1) % size);
    EXPECT_EQ(circle.solve(), PrioritySolver::SOLVED);
}

TEST(PrioritySolver, resultsOfBigGraphsHoldAndDoNotDependOnTheOrderOfAddition) {
    std::mt19937 random(7);
    for (int round = 0; round < 20; ++round) {
        constexpr std::size_t size = 500;
        SolverProblem problem{0, 400, std::vector<std::optional<int>>(size), {}};
        for (std::size_t nb = 0; nb < 900; ++nb) {
            const std::size_t lhs = random() % size, rhs = random() % size;
            if (lhs == rhs) continue;
            const auto kind = nb % 20 == 0 ? LESS : LESS_EQUAL;
            problem.relations.push_back({std::min(lhs, rhs), kind, std::max(lhs, rhs)});
        }
        for (std::size_t i = 1; i < 5; ++i) problem.priorities[i * 100] = static_cast<int>(80 * i);

        PrioritySolver solver = problem.makeSolver();
        ASSERT_EQ(solver.solve(), PrioritySolver::SOLVED);
        const Numbers numbers = numbersOf(solver, size);
        for (const auto& relation : problem.relations)
            EXPECT_TRUE(problem.holds(relation, numbers));
        for (const int number : numbers) EXPECT_TRUE(number >= 0 && number <= 400) << number;

        // The same with the relations shuffled and the priorities counted from the other end.
        SolverProblem mirrored = problem;
        std::reverse(mirrored.priorities.begin(), mirrored.priorities.end());
        std::shuffle(mirrored.relations.begin(), mirrored.relations.end(), random);
        for (auto& relation : mirrored.relations) {
            relation = {size - 1 - relation.lhs, relation.kind, size - 1 - relation.rhs};
        }
        PrioritySolver other = mirrored.makeSolver();
        ASSERT_EQ(other.solve(), PrioritySolver::SOLVED);
        Numbers mirroredNumbers = numbersOf(other, size);
        std::reverse(mirroredNumbers.begin(), mirroredNumbers.end());
        EXPECT_EQ(mirroredNumbers, numbers);
    }
}

}  // namespace

}  // namespace Orv
