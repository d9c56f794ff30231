#include "lkFutexPosix.h"

#include <algorithm>
#include <cerrno>
#include <sys/syscall.h>
#include <unistd.h>

#include "lkTimeLimit.h"

namespace Orv {

namespace {

LkTimeLimit untilNextWatch(LkFutexPosix::Watch watch) {
    return watch == LkFutexPosix::WATCH_OWNER ? LkTimeLimit(1.0) : LkTimeLimit();
}

bool hasEnded(std::uint32_t thread) noexcept {
    const int kept = errno;  // taking a lock is no system call to its user
    const bool result = ::syscall(SYS_tgkill, ::getpid(), thread, 0) != 0 && errno == ESRCH;
    errno = kept;
    return result;
}

}  // namespace

bool LkFutexPosix::lockSlowly(std::uint32_t self, Watch watch) {
    if (getOwner() == self) {
        _nbReentries.store(getDepth(), std::memory_order_relaxed);
        return true;
    }
    return takeByLooking(self) || takeBySleeping(self, watch);
}

/// Each look takes the word away from its owner's processor, so they become rarer.
bool LkFutexPosix::takeByLooking(std::uint32_t self) noexcept {
    constexpr unsigned mostPauses = 16;
    unsigned nbPauses = 1;
    return _adaptiveWait.look([&] {
        if (!isHeld() && take(self)) return true;
        for (unsigned i = 0; i < nbPauses; ++i) __builtin_ia32_pause();
        nbPauses = std::min(2 * nbPauses, mostPauses);
        return false;
    });
}

/// Takes the lock with the sleepers' bit set, as nobody knows whether others sleep as well: at
/// worst the next unlock wakes nobody.
bool LkFutexPosix::takeBySleeping(std::uint32_t self, Watch watch) {
    LkTimeLimit limit = untilNextWatch(watch);
    std::uint32_t deadOwner = 0;  // who has ended and held the lock when it was last looked at
    for (;;) {
        std::uint32_t word = _word.load(std::memory_order_relaxed);
        const std::uint32_t owner = word & ~SLEEPERS;
        if (owner == 0 || owner == deadOwner) {
            if (_word.compare_exchange_strong(word, self | SLEEPERS, std::memory_order_acquire,
                                              std::memory_order_relaxed)) {
                _nbReentries.store(0, std::memory_order_relaxed);
                return owner == 0;
            }
            continue;
        }
        if (word == owner &&
            !_word.compare_exchange_strong(word, owner | SLEEPERS, std::memory_order_relaxed)) {
            continue;
        }
        if (!LkAddressWaitPosix::wait(&_word, owner | SLEEPERS, limit)) {
            limit = untilNextWatch(watch);
            if (hasEnded(owner)) deadOwner = owner;
        }
    }
}

}  // namespace Orv
