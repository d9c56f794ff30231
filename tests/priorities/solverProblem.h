#pragma once

#include <algorithm>
#include <cstddef>
#include <optional>
#include <ostream>
#include <vector>

#include "prioritySolver.h"

namespace Orv {

/// A problem for the solver, and what trying out every assignment says about it.
struct SolverProblem {
    enum Kind { EQUAL, LESS, LESS_EQUAL };

    struct Relation {
        std::size_t lhs;
        Kind kind;
        std::size_t rhs;
    };

    using Numbers = std::vector<int>;

    int min = 0;
    int max = 31;
    std::vector<std::optional<int>> priorities;  // empty: derived
    std::vector<Relation> relations;

    PrioritySolver makeSolver() const;

    bool holds(const Relation&, const Numbers&) const;

    /// Every assignment within the range that fulfils all relations, by trying.
    std::vector<Numbers> findAllSolutions() const;

    /// The one of these that the packing rule asks for, by the rule's own words.
    Numbers pack(const std::vector<Numbers>& solutions) const;

private:
    using MaybeNumbers = std::vector<std::optional<int>>;

    std::vector<std::vector<bool>> findWhoIsBelow() const;
    static std::optional<int> findExtreme(std::size_t priority, bool isHighest,
                                          const MaybeNumbers& numbered,
                                          const std::vector<Numbers>& solutions);
    void tryNumbers(Numbers&, std::vector<Numbers>& found) const;
};

inline PrioritySolver SolverProblem::makeSolver() const {
    PrioritySolver solver(min, max);
    for (const std::optional<int>& number : priorities) {
        number ? solver.addFixed(*number) : solver.addDerived();
    }
    for (const Relation& relation : relations) {
        const auto lhs = static_cast<PrioritySolver::Index>(relation.lhs);
        const auto rhs = static_cast<PrioritySolver::Index>(relation.rhs);
        if (relation.kind == EQUAL) solver.addEqual(lhs, rhs);
        if (relation.kind == LESS) solver.addLess(lhs, rhs);
        if (relation.kind == LESS_EQUAL) solver.addLessOrEqual(lhs, rhs);
    }
    return solver;
}

inline bool SolverProblem::holds(const Relation& relation, const Numbers& numbers) const {
    const int lhs = numbers[relation.lhs];
    const int rhs = numbers[relation.rhs];
    switch (relation.kind) {
        case EQUAL:
            return lhs == rhs;
        case LESS:
            return lhs < rhs;
        default:
            return lhs <= rhs;
    }
}

inline std::vector<SolverProblem::Numbers> SolverProblem::findAllSolutions() const {
    std::vector<Numbers> found;
    Numbers numbers;
    tryNumbers(numbers, found);
    return found;
}

inline void SolverProblem::tryNumbers(Numbers& numbers, std::vector<Numbers>& found) const {
    const std::size_t nbKnown = numbers.size();
    for (const Relation& relation : relations) {
        if (std::max(relation.lhs, relation.rhs) < nbKnown && !holds(relation, numbers)) return;
    }
    if (nbKnown == priorities.size()) {
        found.push_back(numbers);
        return;
    }
    const std::optional<int> fixed = priorities[nbKnown];
    for (int number = fixed.value_or(min); number <= fixed.value_or(max); ++number) {
        numbers.push_back(number);
        tryNumbers(numbers, found);
        numbers.pop_back();
    }
}

inline std::vector<std::vector<bool>> SolverProblem::findWhoIsBelow() const {
    const std::size_t size = priorities.size();
    std::vector<std::vector<bool>> isBelow(size, std::vector<bool>(size, false));
    for (const Relation& relation : relations) {
        isBelow[relation.lhs][relation.rhs] = true;
        if (relation.kind == EQUAL) isBelow[relation.rhs][relation.lhs] = true;
    }
    for (std::size_t via = 0; via < size; ++via) {
        for (std::size_t low = 0; low < size; ++low) {
            for (std::size_t high = 0; high < size; ++high) {
                if (isBelow[low][via] && isBelow[via][high]) isBelow[low][high] = true;
            }
        }
    }
    return isBelow;
}

/// The extreme number that a priority has in any solution that agrees with what is numbered.
inline std::optional<int> SolverProblem::findExtreme(std::size_t priority, bool isHighest,
                                                     const MaybeNumbers& numbered,
                                                     const std::vector<Numbers>& solutions) {
    std::optional<int> extreme;
    for (const Numbers& solution : solutions) {
        const auto agrees = [](std::optional<int> known, int number) {
            return known.value_or(number) == number;
        };
        if (!std::equal(numbered.begin(), numbered.end(), solution.begin(), agrees)) continue;
        const int number = solution[priority];
        if (!extreme || (isHighest ? number > *extreme : number < *extreme)) extreme = number;
    }
    return extreme;
}

inline SolverProblem::Numbers SolverProblem::pack(const std::vector<Numbers>& solutions) const {
    const auto isBelow = findWhoIsBelow();
    MaybeNumbers numbered = priorities;

    const auto numberAll = [&](bool isDown) {
        auto next = numbered;
        for (std::size_t i = 0; i < numbered.size(); ++i) {
            bool isConcerned = false;
            for (std::size_t j = 0; j < numbered.size(); ++j) {
                if (numbered[j] && (isDown ? isBelow[i][j] : isBelow[j][i])) isConcerned = true;
            }
            if (isConcerned && !numbered[i]) next[i] = findExtreme(i, isDown, numbered, solutions);
        }
        const bool isNew = next != numbered;
        numbered = next;
        return isNew;
    };

    for (bool isNew = true; isNew;) {
        isNew = numberAll(true);
        isNew = numberAll(false) || isNew;
    }
    Numbers result;
    for (std::size_t i = 0; i < numbered.size(); ++i) {
        result.push_back(numbered[i] ? *numbered[i] : *findExtreme(i, false, numbered, solutions));
    }
    return result;
}

inline std::ostream& operator<<(std::ostream& stream, const SolverProblem& problem) {
    stream << "range " << problem.min << ".." << problem.max << ", priorities";
    for (const auto& number : problem.priorities) {
        number ? stream << ' ' << *number : stream << " ?";
    }
    static constexpr const char* kinds[] = {" == ", " < ", " <= "};
    for (const auto& relation : problem.relations) {
        stream << ", " << relation.lhs << kinds[relation.kind] << relation.rhs;
    }
    return stream;
}

}  // namespace Orv
