#include "lgWakeupWindows.h"

#include <windows.h>

#include "assertions.h"

namespace Orv {

LgWakeupWindows::LgWakeupWindows() : _event(::CreateEventW(nullptr, FALSE, FALSE, nullptr)) {
    ORV_ASSERT_SYS(_event != nullptr, "_event != NULL", static_cast<int>(::GetLastError()));
}

LgWakeupWindows::~LgWakeupWindows() {
    ::CloseHandle(_event);
}

void LgWakeupWindows::wait() noexcept {
    ::WaitForSingleObject(_event, INFINITE);
}

void LgWakeupWindows::wake() noexcept {
    ::SetEvent(_event);
}

}  // namespace Orv
