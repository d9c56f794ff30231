#include "daHugePagesWindows.h"

#include <windows.h>

namespace Orv {

bool DaHugePagesWindows::enable() noexcept {
    HANDLE token = nullptr;
    if (!::OpenProcessToken(::GetCurrentProcess(), TOKEN_ADJUST_PRIVILEGES | TOKEN_QUERY, &token)) {
        return false;
    }
    TOKEN_PRIVILEGES wanted = {};
    wanted.PrivilegeCount = 1;
    wanted.Privileges[0].Attributes = SE_PRIVILEGE_ENABLED;
    ::SetLastError(ERROR_SUCCESS);
    // Succeeds also if the user does not have the right: that shows only in the last error.
    const bool isEnabled =
        ::LookupPrivilegeValueW(nullptr, L"SeLockMemoryPrivilege", &wanted.Privileges[0].Luid) &&
        ::AdjustTokenPrivileges(token, FALSE, &wanted, 0, nullptr, nullptr) &&
        ::GetLastError() == ERROR_SUCCESS;
    const DWORD osError = ::GetLastError();
    ::CloseHandle(token);
    ::SetLastError(osError);
    return isEnabled;
}

std::uint64_t DaHugePagesWindows::roundUp(std::uint64_t size) noexcept {
    const std::uint64_t page = ::GetLargePageMinimum();
    if (page == 0) {
        ::SetLastError(ERROR_NOT_SUPPORTED);
        return 0;
    }
    const std::uint64_t rounded = (size + (page - 1)) / page * page;
    if (rounded < size) ::SetLastError(ERROR_NOT_ENOUGH_MEMORY);
    return rounded < size ? 0 : rounded;
}

}  // namespace Orv
