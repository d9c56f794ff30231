#pragma once

#include <cstdint>
#include <iosfwd>
#include <memory>

#include "liString.h"
#include "prioritySeat.h"
#include "resmgtApi.h"

namespace Orv {

class PriorityLink;
class PriorityMgr;
class PriorityRelation;

/// Something that runs at a priority: a node whose number its manager derives from relations to
/// others, or that has a fixed number.
///
/// A derived class is told of its number by updatePriority(). Priorities are told apart by
/// identity; their names serve messages only and may repeat.
///
/// - Threads: every member may be called by any thread; see updatePriority() for destruction.
/// - Ownership: registered with its manager, which must outlive it, from construction to
///   destruction. Destroying it removes its relations, too.
class ORV_RESMGT_API Priority {
public:
    static constexpr int DERIVED = -1;

    /// @param number  any number, also outside the manager's range, or DERIVED.
    Priority(const LiString& name, PriorityMgr& mgr, int number = DERIVED);

    /// A priority of its own with the same name, number and manager, in no relation.
    Priority(const Priority&);
    Priority& operator=(const Priority&) = delete;

    virtual ~Priority();

    /// Brings the manager up to date first, as PriorityMgr::update().
    /// @throws PriorityEx as long as the manager's relations contradict themselves.
    int getPriority() const;

    /// Fixes the number, or with DERIVED leaves it to the relations.
    void setPriority(int number);

    PriorityMgr& getMgr() const noexcept { return _mgr; }
    LiString getName() const;
    void setName(const LiString&);
    bool isFixed() const;

    /// Whether the last update found it fixed or tied, directly or through others, to one that is.
    bool isTied() const;

    bool isIndependantButNotSet() const;  ///< Neither fixed nor in a relation.

    void dump(std::ostream&) const;

protected:
    /// Called with the new number after an update has changed it (or isTied()), and with the first
    /// one; what it throws is traced. It may use, create and destroy priorities and relations.
    ///
    /// - Threads: called on any thread that updates, without the manager's lock, and for one
    ///   priority on one thread at a time. Other threads than the one that constructed it call it
    ///   only once a relation, getPriority() or setPriority() has used it.
    /// - A class that overrides this calls PriorityMgr::remove() at the beginning of its
    ///   destructor; that waits for a call on another thread.
    virtual void updatePriority(int number);

private:
    friend class PriorityMgr;
    friend class PriorityNotifier;
    friend class PriorityRelation;

    using Relations = PrioritySeat<PriorityRelation>::List;

    PriorityMgr& _mgr;
    const std::shared_ptr<PriorityLink> _link;  // never null

    // Guarded by the manager's lock:
    LiString _name;
    bool _isFixed;
    bool _isTied = false;
    int _number;
    std::uint32_t _index = 0;  // in the solver, during an update
    PrioritySeat<Priority> _seat{this};
    Relations _asLeft, _asRight;

    int getGiven() const;  // the fixed number, or DERIVED
    void dumpNoLock(std::ostream&) const;
};

}  // namespace Orv
