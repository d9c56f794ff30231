#include "lkParkerWindows.h"

#include <windows.h>

#include "assertions.h"
#include "osError.h"

namespace Orv {

LkParkerWindows::LkParkerWindows() : _event(::CreateEventA(nullptr, FALSE, FALSE, nullptr)) {
    ORV_ASSERT_SYS(_event != nullptr, "_event!= NULL", OsError::getLast());
}

LkParkerWindows::~LkParkerWindows() {
    ::CloseHandle(_event);
}

bool LkParkerWindows::sleep(const std::atomic<std::uint32_t>&, std::uint32_t,
                            const LkTimeLimit& limit) {
    // The system may count a tick less than was asked for.
    for (;;) {
        const DWORD milliseconds = limit.getRemainingMilliseconds();
        const DWORD ret = ::WaitForSingleObject(_event, milliseconds);
        ORV_ASSERT_SYS(ret == WAIT_OBJECT_0 || ret == WAIT_TIMEOUT,
                       limit.isInfinite()
                           ? "::WaitForSingleObject( _event, INFINITE ) == WAIT_OBJECT_0"
                           : "ret == WAIT_OBJECT_0 || ret == WAIT_TIMEOUT",
                       OsError::getLast());
        if (ret == WAIT_OBJECT_0) return true;
        if (milliseconds == 0) return false;
    }
}

void LkParkerWindows::wake(const std::atomic<std::uint32_t>&) noexcept {
    ::SetEvent(_event);
}

}  // namespace Orv
