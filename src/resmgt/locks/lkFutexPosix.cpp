#include "lkFutexPosix.h"

#include <cerrno>
#include <csignal>
#include <ctime>
#include <linux/futex.h>
#include <sys/syscall.h>
#include <unistd.h>

#include "assertions.h"
#include "lkSpinner.h"

namespace Orv {

namespace {

constexpr timespec watchPeriod{.tv_sec = 1, .tv_nsec = 0};

/// Keeps the caller's errno: taking a lock is no system call to its user.
class ErrnoKeeper {
public:
    ErrnoKeeper() noexcept : _errno(errno) {}
    ~ErrnoKeeper() { errno = _errno; }
    ErrnoKeeper(const ErrnoKeeper&) = delete;
    ErrnoKeeper& operator=(const ErrnoKeeper&) = delete;

private:
    const int _errno;
};

bool hasEnded(std::uint32_t thread) noexcept {
    return ::syscall(SYS_tgkill, ::getpid(), thread, 0) != 0 && errno == ESRCH;
}

}  // namespace

bool LkFutexPosix::lockSlowly(std::uint32_t self, Watch watch) {
    if (getOwner() == self) {
        _nbReentries.store(getDepth(), std::memory_order_relaxed);
        return true;
    }
    return takeByLooking(self) || takeBySleeping(self, watch);
}

/// Looks for a while, unless that was in vain lately: each failure doubles the number of later
/// attempts that go without.
bool LkFutexPosix::takeByLooking(std::uint32_t self) noexcept {
    constexpr auto relaxed = std::memory_order_relaxed;
    constexpr std::uint8_t mostBlind = 63;
    if (const std::uint8_t left = _nbBlindLeft.load(relaxed)) {
        _nbBlindLeft.store(static_cast<std::uint8_t>(left - 1), relaxed);
        return false;
    }
    LkSpinner spinner;
    while (spinner.pause()) {
        if (!isHeld() && take(self)) {
            _nbBlind.store(0, relaxed);
            return true;
        }
    }
    const auto nbBlind = static_cast<std::uint8_t>((_nbBlind.load(relaxed) * 2 + 1) & mostBlind);
    _nbBlind.store(nbBlind, relaxed);
    _nbBlindLeft.store(nbBlind, relaxed);
    return false;
}

/// Takes the lock with the sleepers' bit set, as nobody knows whether others sleep as well: at
/// worst the next unlock wakes nobody.
bool LkFutexPosix::takeBySleeping(std::uint32_t self, Watch watch) {
    const ErrnoKeeper errnoKeeper;
    const timespec* const timeout = watch == WATCH_OWNER ? &watchPeriod : nullptr;
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
        if (::syscall(SYS_futex, &_word, FUTEX_WAIT_PRIVATE, owner | SLEEPERS, timeout) == 0 ||
            errno == EAGAIN) {
            continue;
        }
        ORV_ASSERT_SYS(errno == EINTR || errno == ETIMEDOUT,
                       "::syscall( SYS_futex, &_word, FUTEX_WAIT_PRIVATE, word, timeout ) == 0",
                       errno);
        if (watch == WATCH_OWNER && hasEnded(owner)) deadOwner = owner;
    }
}

void LkFutexPosix::wakeOne(Word* word) noexcept {
    const ErrnoKeeper errnoKeeper;
    // The word may have gone with its lock by now; the kernel uses no more than its address.
    ::syscall(SYS_futex, word, FUTEX_WAKE_PRIVATE, 1);
}

}  // namespace Orv
