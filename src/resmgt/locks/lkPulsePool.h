#pragma once

#include <vector>

#include "lkLock.h"
#include "lkPulse.h"
#include "objPtr.h"

namespace Orv {

/// Keeps wake-all pulses for those that need one for a short time, such as streams.
///
/// - Threads: every member by any thread.
/// - Ownership: a pulse that was got belongs to the caller, who may recycle or destroy it.
class ORV_RESMGT_API LkPulsePool {
public:
    LkPulsePool();
    ~LkPulsePool();

    LkPulsePool(const LkPulsePool&) = delete;
    LkPulsePool& operator=(const LkPulsePool&) = delete;

    ObjPtrRet<LkPulse> getPulse();  ///< Like new: not pulsed.

    /// Takes the pulse and leaves @p pulse empty. Nobody waits at it any more. An empty one throws
    /// RCEx::ExNullPtr, one that does not wake all is an assertion.
    void recyclePulse(ObjPtr<LkPulse>& pulse);

private:
    LkLock _lock;
    std::vector<ObjPtr<LkPulse>> _idlePulses ORV_GUARDED_BY(_lock);
};

}  // namespace Orv
