#pragma once

#include <unordered_map>
#include <vector>

#include "devMgrCallbackPrivate.h"
#include "devMgrPropertyObserver.h"
#include "liUuid.h"
#include "lkLock.h"

namespace Orv {

/// The observers of one property, of all access objects of a manager; shared with the property's
/// event object and with the notifications on their way.
///
/// - Threads: deliver() on the manager's thread, everything else by any.
class DevMgrObserverList : public RCBase<LkCounter<long>> {
public:
    class Entry : public DevMgrCallback {
    public:
        Entry(RCShdPtr<DevMgrFifo> manager, const void* accessObject,
              RCShdPtr<DevMDPropertyAny> observed, RCShdPtr<DevMgrPropertyObserver> observing)
            : DevMgrCallback(std::move(manager)),
              owner(accessObject),
              property(std::move(observed)),
              observer(std::move(observing)) {}
        void tell(unsigned mask) noexcept;

        const void* const owner;
        const RCShdPtr<DevMDPropertyAny> property;
        const RCShdPtr<DevMgrPropertyObserver> observer;
    };

    void add(const RCShdPtr<Entry>& entry);  ///< Once for each owner and observer.

    /// For the caller to detach. @return null if it is not there.
    RCShdPtr<Entry> remove(const void* owner, const DevMgrPropertyObserver& observer);
    bool isEmpty() const;

    void deliver(unsigned mask) noexcept;

private:
    mutable LkLock _lock{"DevMgrObserverList"};
    std::vector<RCShdPtr<Entry>> _entries ORV_GUARDED_BY(_lock);
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
