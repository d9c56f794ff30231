#pragma once

#include <iosfwd>

#include "liString.h"
#include "prioritySeat.h"
#include "resmgtApi.h"

namespace Orv {

class Priority;
class PriorityMgr;

/// Statement that two priorities of one manager are equal, or one is below the other.
///
/// It counts from construction to destruction. When it or one of the two priorities is removed from
/// the manager, it becomes inert: it says nothing any more.
///
/// - Threads: every member may be called by any thread.
/// - Ownership: borrows the priorities, which may go before or after it, and the manager, which
///   must outlive it.
class ORV_RESMGT_API PriorityRelation {
public:
    enum Relation {
        EQUAL = 0,
        LESS = 1,           ///< Left below right.
        LESS_OR_EQUAL = 2,  ///< Left not above right.
    };

    /// Both priorities are registered with one manager. Whether the relation can hold, shows when
    /// that is next brought up to date.
    PriorityRelation(const LiString& name, Priority& left, Relation kind, Priority& right);
    ~PriorityRelation();

    PriorityRelation(const PriorityRelation&) = delete;
    PriorityRelation& operator=(const PriorityRelation&) = delete;

    const LiString& getName() const noexcept { return _name; }
    Relation getRelation() const noexcept { return _kind; }

    /// Whether it holds for the present numbers, those of the last update; true when inert.
    bool check() const;

    /// The number next to the other side's: the highest for the left, the lowest for the right.
    int computeLhsPriority(int rhs) const;
    int computeRhsPriority(int lhs) const;

    /// "==", "< " or "<=".
    static const char* relationToString(Relation);

    void dump(std::ostream&) const;

private:
    friend class Priority;
    friend class PriorityMgr;

    const LiString _name;
    const Relation _kind;
    PriorityMgr& _mgr;

    // Guarded by the manager's lock:
    Priority* _left;  // both null when inert
    Priority* _right;
    PrioritySeat<PriorityRelation> _seat{this}, _leftSeat{this}, _rightSeat{this};

    bool checkNoLock() const;
    void dumpNoLock(std::ostream&) const;
};

}  // namespace Orv
