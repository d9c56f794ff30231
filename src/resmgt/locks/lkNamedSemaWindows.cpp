#include "lkNamedSemaWindows.h"

#include <algorithm>
#include <string>
#include <utility>
#include <windows.h>

#include "assertions.h"
#include "osError.h"

namespace Orv {

namespace {

/// The system's form of a UTF-8 name, or an error: what is no UTF-8 could meet another name.
int toSystemName(const char* osName, std::wstring& systemName) {
    std::string name = osName;
    std::replace(name.begin(), name.end(), '\\', '/');  // the system keeps backslashes to itself
    if (name.empty()) return ERROR_INVALID_NAME;
    if (name.size() >= MAX_PATH) return ERROR_FILENAME_EXCED_RANGE;
    wchar_t buffer[MAX_PATH];
    const int length =
        ::MultiByteToWideChar(CP_UTF8, MB_ERR_INVALID_CHARS, name.c_str(), -1, buffer, MAX_PATH);
    if (length == 0) return OsError::getLast();
    systemName = buffer;
    return 0;
}

}  // namespace

LkNamedSemaWindows::LkNamedSemaWindows(const char* osName, unsigned initialCount,
                                       LkSemaTypes::CreateFlag createFlag)
    : _sema(nullptr), _errno(0) {
    std::wstring name;
    if (osName != nullptr) _errno = toSystemName(osName, name);
    if (_errno != 0) return;
    ::SetLastError(ERROR_SUCCESS);
    const wchar_t* const systemName = osName != nullptr ? name.c_str() : nullptr;
    if (createFlag == LkSemaTypes::OPEN) {
        _sema = ::OpenSemaphoreW(SEMAPHORE_ALL_ACCESS, FALSE, systemName);
    } else {
        // A count above the highest is a negative one to the system, which refuses it.
        _sema = ::CreateSemaphoreW(nullptr, static_cast<LONG>(initialCount),
                                   LkSemaTypes::HIGHEST_COUNT, systemName);
    }
    const int error = OsError::getLast();
    if (createFlag == LkSemaTypes::CREATE_EXCLUSIVE && error == ERROR_ALREADY_EXISTS) close();
    if (_sema == nullptr) _errno = error;
}

int LkNamedSemaWindows::close() noexcept {
    void* const sema = std::exchange(_sema, nullptr);
    return sema == nullptr || ::CloseHandle(sema) ? 0 : OsError::getLast();
}

void LkNamedSemaWindows::post() {
    ORV_ASSERT_SYS(::ReleaseSemaphore(_sema, 1, nullptr), "::ReleaseSemaphore( _sema, 1, 0 )",
                   OsError::getLast());
}

void LkNamedSemaWindows::wait() {
    ORV_ASSERT_SYS(::WaitForSingleObject(_sema, INFINITE) == WAIT_OBJECT_0,
                   "::WaitForSingleObject( _sema, INFINITE ) == WAIT_OBJECT_0", OsError::getLast());
}

bool LkNamedSemaWindows::tryWait() {
    const DWORD result = ::WaitForSingleObject(_sema, 0);
    if (result == WAIT_OBJECT_0) return true;
    ORV_ASSERT_SYS(result == WAIT_TIMEOUT, "result == WAIT_TIMEOUT", OsError::getLast());
    return false;
}

}  // namespace Orv
