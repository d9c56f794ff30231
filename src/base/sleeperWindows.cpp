#include <windows.h>

#include "dtTimeMark.h"
#include "sleeper.h"
#include "waitableTimerWindows.h"

namespace Orv {

void Sleeper::sleepUntil(const DtTimeMark& deadline) {
    if (deadline <= DtTimeMark::now()) return;
    WaitableTimerWindows timer;
    timer.waitUntil(deadline);
}

void Sleeper::yield() noexcept {
    ::Sleep(0);
}

}  // namespace Orv
