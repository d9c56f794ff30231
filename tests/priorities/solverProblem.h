#pragma once

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
    std::vector<std::vector<bool>> findWhoIsBelow() const;
    void tryNumbers(Numbers&, std::vector<Numbers>& found) const;
};

std::ostream& operator<<(std::ostream&, const SolverProblem&);

}  // namespace Orv
