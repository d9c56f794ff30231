#pragma once

#include <atomic>

#include "devMDPropertyAEO.h"
#include "lkLock.h"
#include "objPtr.h"
#include "rcBase.h"
#include "rcShdPtr.h"

namespace Orv {

/// The place of a property's one event object, which may be replaced while it runs: it then lives
/// until that call has returned.
///
/// - Threads: any. No lock is held while the event object runs.
class ORV_RESMGT_API DevMDStdPropertyObserver {
public:
    void set(ObjPtr<DevMDPropertyAEO> aeo);  ///< Its own object again: nothing happens.
    void notify(unsigned mask) noexcept;     ///< What the event object throws is traced.

private:
    struct Held : RCBase<LkCounter<long>> {
        explicit Held(ObjPtr<DevMDPropertyAEO> owned) : aeo(std::move(owned)) {}
        const ObjPtr<DevMDPropertyAEO> aeo;
    };

    std::atomic<bool> _isSet{false};  // spares properties that nobody observes the lock
    LkLock _lock{"DevMDStdProperty"};
    RCShdPtr<Held> _held ORV_GUARDED_BY(_lock);
};

}  // namespace Orv
