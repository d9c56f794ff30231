#include <cerrno>
#include <sched.h>
#include <time.h>

#include "assertions.h"
#include "dtTimeMark.h"
#include "sleeper.h"

namespace Orv {

void Sleeper::sleepUntil(const DtTimeMark& deadline) {
    constexpr std::int64_t SECOND = 1'000'000'000;
    const std::int64_t nanoseconds = deadline.getNanoseconds();
    if (nanoseconds <= 0) return;
    const timespec until{.tv_sec = nanoseconds / SECOND, .tv_nsec = nanoseconds % SECOND};
    int result;
    do {
        result = ::clock_nanosleep(CLOCK_MONOTONIC, TIMER_ABSTIME, &until, nullptr);
    } while (result == EINTR);
    ORV_ASSERT_SYS(result == 0, "::clock_nanosleep( CLOCK_MONOTONIC ) == 0", result);
}

void Sleeper::yield() noexcept {
    ::sched_yield();
}

}  // namespace Orv
