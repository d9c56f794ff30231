#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "resmgtApi.h"

namespace Orv {

class PriorityGraph;

/// Finds numbers for priorities of which only relations, a range and some numbers are known.
///
/// It finds numbers whenever there are any. Which ones, follows from the relations alone, not from
/// the order in which they were added:
///
/// 1. Fixed priorities have their numbers, which may lie outside the range; all others stay inside.
///    Priorities that must be equal (`==`, circles of `<=`) count as one.
/// 2. All that stand below a numbered one, directly or through others, get the highest numbers they
///    can have together. Then all that stand above a numbered one get the lowest. This alternates,
///    each time with what has a number by then, until no relation leads further. So a priority
///    between two fixed ones stands next to the upper one.
/// 3. All others are tied to nothing fixed and get the lowest numbers they can have, counted from
///    the beginning of the range.
///
/// - Threads: like any value. Time: proportional to priorities and relations, but for a sort.
class ORV_RESMGT_API PrioritySolver {
public:
    using Index = std::uint32_t;  ///< Priorities and relations count from 0 in order of addition.

    enum Outcome {
        SOLVED,
        EMPTY_RANGE,      ///< The culprit is a priority whose low bound exceeds its high bound.
        BROKEN_RELATION,  ///< All ranges hold numbers; the culprit is a relation that fails.
    };

    /// @param min,max  bounds, included, of the numbers to be found.
    PrioritySolver(int min, int max);

    Index addDerived();          ///< A priority to find a number for.
    Index addFixed(int number);  ///< A priority that has one.
    void addEqual(Index lhs, Index rhs);
    void addLess(Index lhs, Index rhs);
    void addLessOrEqual(Index lhs, Index rhs);

    /// Finds numbers for all that was added. On failure, the first culprit in order of addition.
    Outcome solve();

    Index getCulprit() const noexcept { return _culprit; }

    /// The number found; after BROKEN_RELATION, the one with which the relation fails.
    int getNumber(Index priority) const noexcept;

    /// Bounds that the relations leave, whatever numbers the neighbours take. A fixed priority has
    /// its number as both. Known after each solve(); an empty range may lie outside of int.
    std::int64_t getLow(Index priority) const noexcept;
    std::int64_t getHigh(Index priority) const noexcept;

    /// Whether it is fixed or tied, directly or through others, to one that is. After SOLVED only.
    bool isTied(Index priority) const noexcept;

private:
    struct Relation {
        Index lhs;
        Index rhs;
        int step;  // by which the right one stands above the left one at least
        bool isEqual;
    };

    /// Priorities that must be equal, as one.
    struct EqualSet {
        std::int64_t low = 0;
        std::int64_t high = 0;
        std::int64_t number = 0;
        bool hasFixed = false;
        bool isReached = false;  // has a number, or gets one in the present wave
        bool isNumbered = false;
    };

    class Packing;

    int _min;
    int _max;
    std::vector<int> _fixedNumbers;  // per priority, 0 where derived
    std::vector<bool> _isFixed;
    std::vector<Relation> _relations;
    std::vector<Index> _setOf;
    std::vector<EqualSet> _sets;  // from low to high
    Index _culprit = 0;

    void findEqualSets();
    PriorityGraph relateSets() const;
    void boundSets(const PriorityGraph&);
    bool findEmptyRange();
    bool findBrokenRelation();
    const EqualSet& setOf(Index priority) const noexcept { return _sets[_setOf[priority]]; }
};

}  // namespace Orv
