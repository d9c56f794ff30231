#pragma once

#include <iosfwd>
#include <memory>

#include "liString.h"
#include "lkRecLock.h"
#include "priority.h"
#include "priorityEx.h"
#include "priorityRelation.h"
#include "prioritySolver.h"
#include "resmgtApi.h"
#include "threadSafety.h"

namespace Orv {

class PriorityNotifier;

/// Derives numbers within a range for priorities that are related to each other and to fixed ones;
/// PrioritySolver says which numbers.
///
/// Changes only mark it as not up to date: adding, removing and setting never fail. update() and
/// Priority::getPriority() bring it up to date, or throw as long as the relations contradict
/// themselves; the derived numbers of the last good update stand meanwhile.
///
/// - Threads: every member may be called by any thread.
/// - Ownership: priorities and relations belong to others and register themselves; all must be gone
///   before the manager, else its destructor asserts.
class ORV_RESMGT_API PriorityMgr {
public:
    enum Error { NONE = 0, TRANSIENT_INVALID = 1, RELATION_INVALID = 2 };
    enum NotifyType { NUMBER_SET = 0, RELATIONS_CHANGED = 1 };

    /// @param min,max  the numbers to be given, both included.
    PriorityMgr(const LiString& name, int min, int max);
    virtual ~PriorityMgr() noexcept(false);

    PriorityMgr(const PriorityMgr&) = delete;
    PriorityMgr& operator=(const PriorityMgr&) = delete;

    /// Constructors and destructors do this; adding or removing twice does nothing. Removing a
    /// priority removes its relations, and waits while another thread is telling it its number. A
    /// removed priority may be added again, a removed relation stays inert.
    void add(Priority&);
    void add(PriorityRelation&);
    void remove(Priority&);
    void remove(PriorityRelation&);

    /// Finds numbers and tells priorities whose number has changed, again while these make changes.
    /// What another thread has begun to tell may still be under way when it returns.
    /// @throws PriorityEx::ExTransientInvalid, PriorityEx::ExRelationInvalid naming the culprit.
    void update();

    /// Whether there are numbers for the present relations. Changes none and tells nobody.
    Error check();

    void notify(NotifyType);   ///< Something has changed: the manager is not up to date.
    void enableTracing(bool);  ///< Of dumps after updates; also by the trace level "priorities".

    const LiString& getName() const noexcept { return _name; }

    /// Every priority with its number and relations, every relation with its numbers, and what is
    /// wrong if the last update or check() failed.
    void dump(std::ostream&) const;

protected:
    // Both are called with the manager's lock held, by update(), check() and getPriority(): they
    // neither wait nor destroy priorities.

    /// Works out the numbers, or who prevents them, without giving them to the priorities yet.
    virtual void performUpdate();

    /// Throws what update() throws. An override that returns makes the update end without numbers,
    /// or, if it has changed relations, makes it try again.
    virtual void updateError(Error);

private:
    friend class Priority;
    friend class PriorityRelation;

    using Priorities = PrioritySeat<Priority>::List;
    using Relations = PrioritySeat<PriorityRelation>::List;

    const LiString _name;
    const int _min, _max;
    const LkRecLock _lock{"PriorityMgr"};
    const std::unique_ptr<PriorityNotifier> _notifier;
    Priorities _priorities ORV_GUARDED_BY(_lock);  // in order of addition
    Relations _relations ORV_GUARDED_BY(_lock);
    PrioritySolver _solver ORV_GUARDED_BY(_lock);
    Error _error ORV_GUARDED_BY(_lock) = NONE;      // of the solver's last run
    bool _isSolved ORV_GUARDED_BY(_lock) = true;    // nothing has changed since that
    bool _isUpToDate ORV_GUARDED_BY(_lock) = true;  // the priorities have its numbers
    bool _isTracing ORV_GUARDED_BY(_lock) = false;

    int getNumber(const Priority&);
    void noteUse(const Priority&) ORV_REQUIRES(_lock);
    void leaveNoLock(PriorityRelation&) ORV_REQUIRES(_lock);
    Error solveNoLock() ORV_REQUIRES(_lock);
    void bringUpToDateNoLock() ORV_REQUIRES(_lock);
    void takeNumbersNoLock() ORV_REQUIRES(_lock);
    void traceNumbers() const;
    PriorityEx::ExTransientInvalid makeTransientInvalid() const ORV_REQUIRES(_lock);
    PriorityEx::ExRelationInvalid makeRelationInvalid() const ORV_REQUIRES(_lock);
};

}  // namespace Orv
