#include "lkMutexPosix.h"

#include <cerrno>
#include <ostream>

#include "assertions.h"
#include "lkAdaptiveWait.h"
#include "lkEx.h"

namespace Orv {

bool LkMutexPosix::spinLock(unsigned tries) {
    if (_futex.isHeldByCaller()) {
        throw LkEx::ExDeadLock(ORV_FILE, __LINE__, "LkMutexPosix", _name, 0, "self deadlock");
    }
    LkAdaptiveWait::Look look;
    do {  // 0 tries wrap around to very many
        if (!_futex.isHeld() && _futex.tryLock()) return true;
    } while (--tries != 0 && LkAdaptiveWait::mayLook() && look.goesOn());
    return lock();
}

void LkMutexPosix::failAbandoned() {
    unlock();
    Assertions::throwSysAssertionFailed(ORV_FILE, __LINE__, "_futex.lock( WATCH_OWNER )",
                                        EOWNERDEAD);
}

void LkMutexPosix::failNotOwner() {
    Assertions::throwSysAssertionFailed(ORV_FILE, __LINE__, "_futex.unlock()", EPERM);
}

void LkMutexPosix::dump(std::ostream& stream) const {
    stream << "LkMutex \"" << _name << "\" holder " << _futex.getOwner() << " count "
           << _futex.getDepth();
}

}  // namespace Orv
