#pragma once

#include <atomic>

#include "devAEO.h"
#include "lkLock.h"
#include "objPtr.h"
#include "rcBase.h"
#include "rcShdPtr.h"

namespace Orv {

/// The place of one event object, which may be replaced while it runs: it then lives until that
/// call has returned.
///
/// @tparam AEO  DevAEO or a class below it.
/// - Threads: any. No lock is held while the event object runs.
template <class AEO>
class ORV_HEADER_API DevAEOSlot {
public:
    void set(ObjPtr<AEO> aeo);  ///< Its own object again: nothing happens.

    /// Calls @p call with the event object, if there is one; what that throws is traced.
    template <class Call>
    void tell(Call call) noexcept;

private:
    struct Held : RCBase<LkCounter<long>> {
        explicit Held(ObjPtr<AEO> owned) : aeo(std::move(owned)) {}
        const ObjPtr<AEO> aeo;
    };

    std::atomic<bool> _isSet{false};  // spares those whom nobody listens to the lock
    LkLock _lock{"DevAEOSlot"};
    RCShdPtr<Held> _held ORV_GUARDED_BY(_lock);
};

}  // namespace Orv

#include "devAEOSlot.imp"
