#include "wakeableSleeperWindows.h"

#include <windows.h>

#include "assertions.h"
#include "osError.h"

namespace Orv {

WakeableSleeperWindows::WakeableSleeperWindows()
    : _woken(::CreateEventA(nullptr, FALSE, FALSE, nullptr)) {
    ORV_ASSERT_SYS(_woken != nullptr, "::CreateEvent() != NULL", OsError::getLast());
}

WakeableSleeperWindows::~WakeableSleeperWindows() {
    ::CloseHandle(_woken);
}

void WakeableSleeperWindows::sleepUntil(const DtTimeMark& deadline) {
    _timer.waitUntil(deadline, _woken);
}

void WakeableSleeperWindows::wake() {
    ORV_ASSERT_SYS(::SetEvent(_woken) != 0, "::SetEvent( _woken )", OsError::getLast());
}

}  // namespace Orv
