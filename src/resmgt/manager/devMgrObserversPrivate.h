#pragma once

#include <unordered_map>
#include <vector>

#include "devMgrFifo.h"
#include "devMgrPropertyObserver.h"
#include "liUuid.h"
#include "lkCondVar.h"
#include "lkLock.h"
#include "lkMutex.h"
#include "lkThreadId.h"

namespace Orv {

/// The observers of one property, of all access objects of a manager; shared with the property's
/// event object and with the notifications on their way.
///
/// - Threads: deliver() on the manager's thread, everything else by any.
class DevMgrObserverList : public RCBase<LkCounter<long>> {
public:
    struct Entry : RCBase<LkCounter<long>> {
        Entry(const void* accessObject, RCShdPtr<DevMDPropertyAny> observed,
              RCShdPtr<DevMgrPropertyObserver> observing)
            : owner(accessObject), property(std::move(observed)), observer(std::move(observing)) {}
        const void* const owner;
        const RCShdPtr<DevMDPropertyAny> property;
        const RCShdPtr<DevMgrPropertyObserver> observer;
        bool isDetached = false;  // guarded by the list's mutex
    };

    /// @param manager  who serves: the manager's thread.
    explicit DevMgrObserverList(RCShdPtr<DevMgrFifo> manager) : _manager(std::move(manager)) {}

    void add(const RCShdPtr<Entry>& entry);  ///< Once for each owner and observer.

    /// @return null if it is not there.
    RCShdPtr<Entry> remove(const void* owner, const DevMgrPropertyObserver& observer);
    bool isEmpty() const;

    /// Returns when a removed entry's observer is not running any more; at once on the thread that
    /// runs it.
    void waitUntilIdle(const Entry& entry);

    void deliver(unsigned mask) noexcept;

private:
    const RCShdPtr<DevMgrFifo> _manager;
    mutable LkMutex _mutex{"DevMgrObserverList"};
    LkCondVar _idle{"DevMgrObserverList idle"};
    std::vector<RCShdPtr<Entry>> _entries ORV_GUARDED_BY(_mutex);
    const Entry* _running ORV_GUARDED_BY(_mutex) = nullptr;
    LkThreadId _runner ORV_GUARDED_BY(_mutex);

    void call(Entry& entry, unsigned mask) noexcept;
};

/// All observed properties of a manager. A property has one event object for all its observers.
///
/// - Threads: any. Never waits for an observer while it holds its lock.
class DevMgrObservers {
public:
    explicit DevMgrObservers(RCShdPtr<DevMgrFifo> fifo) : _fifo(std::move(fifo)) {}

    void attach(const void* owner, const RCShdPtr<DevMDPropertyAny>& property,
                const RCShdPtr<DevMgrPropertyObserver>& observer);

    /// @throws DevMgrEx::NameNotRegistered
    void detach(const void* owner, DevMDPropertyAny& property,
                const DevMgrPropertyObserver& observer);

private:
    const RCShdPtr<DevMgrFifo> _fifo;
    LkLock _lock{"Device Property-Observer hash map lock"};
    std::unordered_map<LiUuid, RCShdPtr<DevMgrObserverList>> _lists ORV_GUARDED_BY(_lock);
};

}  // namespace Orv
