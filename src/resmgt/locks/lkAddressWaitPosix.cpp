#include "lkAddressWaitPosix.h"

#include <cerrno>
#include <climits>
#include <ctime>
#include <linux/futex.h>
#include <sys/syscall.h>
#include <unistd.h>

#include "assertions.h"

namespace Orv {

namespace {

/// Waits and wake-ups are no system calls to those who ask for them.
struct ErrnoKeeper {
    const int kept = errno;
    ~ErrnoKeeper() { errno = kept; }
};

int inScope(int operation, LkAddressWaitPosix::Scope scope) noexcept {
    return scope == LkAddressWaitPosix::Scope::PROCESS ? operation | FUTEX_PRIVATE_FLAG : operation;
}

timespec toTimespec(LkTimeLimit::Clock::time_point time) noexcept {
    const auto seconds = std::chrono::floor<std::chrono::seconds>(time.time_since_epoch());
    const std::chrono::nanoseconds rest = time.time_since_epoch() - seconds;
    return {static_cast<time_t>(seconds.count()), static_cast<long>(rest.count())};
}

void wake(const void* address, int nbThreads, LkAddressWaitPosix::Scope scope) noexcept {
    // An address that is gone by now is EFAULT, which is as good as nobody sleeping there.
    const ErrnoKeeper keeper;
    ::syscall(SYS_futex, address, inScope(FUTEX_WAKE, scope), nbThreads, nullptr, nullptr, 0);
}

}  // namespace

bool LkAddressWaitPosix::wait(const void* address, unsigned expected, const LkTimeLimit& limit,
                              Scope scope) {
    const ErrnoKeeper keeper;
    const timespec deadline = toTimespec(limit.getDeadline());
    const long result =
        ::syscall(SYS_futex, address, inScope(FUTEX_WAIT_BITSET, scope), expected,
                  limit.isInfinite() ? nullptr : &deadline, nullptr, FUTEX_BITSET_MATCH_ANY);
    if (result == 0) return true;
    const int error = errno;
    ORV_ASSERT_SYS(error == EAGAIN || error == EINTR || error == ETIMEDOUT,
                   "::syscall( SYS_futex, FUTEX_WAIT_BITSET )", error);
    return error != ETIMEDOUT;
}

void LkAddressWaitPosix::wakeOne(const void* address) noexcept {
    wake(address, 1, Scope::PROCESS);
}

void LkAddressWaitPosix::wakeAll(const void* address, Scope scope) noexcept {
    wake(address, INT_MAX, scope);
}

}  // namespace Orv
