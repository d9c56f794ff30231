#include "lkAddressWaitWindows.h"

#include <windows.h>

#include "assertions.h"
#include "osError.h"

namespace Orv {

void LkAddressWaitWindows::wait(const void* address, unsigned expected, const LkTimeLimit& limit) {
    const BOOL isWoken = ::WaitOnAddress(const_cast<void*>(address), &expected, sizeof expected,
                                         limit.getRemainingMilliseconds());
    const int error = isWoken ? 0 : OsError::getLast();
    ORV_ASSERT_SYS(isWoken || error == ERROR_TIMEOUT,
                   "::WaitOnAddress( address, &expected, sizeof expected, milliseconds )", error);
}

void LkAddressWaitWindows::wakeOne(const void* address) noexcept {
    ::WakeByAddressSingle(const_cast<void*>(address));
}

}  // namespace Orv
