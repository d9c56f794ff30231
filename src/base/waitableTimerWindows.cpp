#include "waitableTimerWindows.h"

#include <algorithm>
#include <windows.h>

#include "assertions.h"
#include "dtTimeMark.h"
#include "osError.h"

#ifndef CREATE_WAITABLE_TIMER_HIGH_RESOLUTION
#define CREATE_WAITABLE_TIMER_HIGH_RESOLUTION 0x00000002
#endif

namespace Orv {

WaitableTimerWindows::WaitableTimerWindows()
    : _timer(::CreateWaitableTimerExW(nullptr, nullptr, CREATE_WAITABLE_TIMER_HIGH_RESOLUTION,
                                      TIMER_ALL_ACCESS)) {
    if (_timer == nullptr) {
        _timer = ::CreateWaitableTimerExW(nullptr, nullptr, 0, TIMER_ALL_ACCESS);
    }
    ORV_ASSERT_SYS(_timer != nullptr, "::CreateWaitableTimerExW() != NULL", OsError::getLast());
}

WaitableTimerWindows::~WaitableTimerWindows() {
    ::CloseHandle(_timer);
}

void WaitableTimerWindows::waitUntil(const DtTimeMark& deadline, void* orObject) {
    // The timer counts from its start and may end a little early by the clock, so look again.
    constexpr std::int64_t LONGEST_NANOSECONDS = 3'600'000'000'000;  // keeps the sum in range
    for (;;) {
        const std::int64_t left = deadline.getNanosecondsSince(DtTimeMark::now());
        if (left <= 0) return;
        LARGE_INTEGER due;
        due.QuadPart = -((std::min(left, LONGEST_NANOSECONDS) + 99) / 100);  // relative, 100 ns
        ORV_ASSERT_SYS(::SetWaitableTimer(_timer, &due, 0, nullptr, nullptr, FALSE) != 0,
                       "::SetWaitableTimer( _timer )", OsError::getLast());
        const HANDLE objects[] = {_timer, orObject};
        const DWORD result =
            ::WaitForMultipleObjects(orObject == nullptr ? 1 : 2, objects, FALSE, INFINITE);
        if (result == WAIT_OBJECT_0 + 1) return;
        ORV_ASSERT_SYS(result == WAIT_OBJECT_0, "::WaitForMultipleObjects() == WAIT_OBJECT_0",
                       OsError::getLast());
    }
}

}  // namespace Orv
