#include "periodicTimerWindows.h"

#include <windows.h>

#include "assertions.h"
#include "osError.h"

namespace Orv {

PeriodicTimerWindows::PeriodicTimerWindows()
    : _woken(::CreateEventA(nullptr, FALSE, FALSE, nullptr)) {
    ORV_ASSERT_SYS(_woken != nullptr, "::CreateEvent() != NULL", OsError::getLast());
}

PeriodicTimerWindows::~PeriodicTimerWindows() {
    ::CloseHandle(_woken);
}

void PeriodicTimerWindows::waitUntil(std::unique_lock<std::mutex>& lock,
                                     const DtTimeMark& deadline) {
    // A wake() between unlock and wait is remembered by the event; one left from earlier only makes
    // the caller look again.
    lock.unlock();
    try {
        _timer.waitUntil(deadline, _woken);
    } catch (...) {
        lock.lock();
        throw;
    }
    lock.lock();
}

void PeriodicTimerWindows::wake() {
    ORV_ASSERT_SYS(::SetEvent(_woken) != 0, "::SetEvent( _woken )", OsError::getLast());
}

}  // namespace Orv
