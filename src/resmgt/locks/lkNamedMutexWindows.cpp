#include "lkNamedMutexWindows.h"

#include <exception>

#include "exSysErrorWindows.h"
#include "sourceFile.h"

namespace Orv {

namespace {

[[noreturn]] void fail(int line, const char* step, DWORD osError) {
    throw ExSysErrorWindows(ORV_FILE, line, step, static_cast<int>(osError));
}

}  // namespace

LkNamedMutexWindows::LkNamedMutexWindows(const char* name)
    : _mutex(::CreateMutexA(nullptr, FALSE, name)) {
    if (_mutex == nullptr) fail(__LINE__, "CreateMutexA", ::GetLastError());
}

LkNamedMutexWindows::~LkNamedMutexWindows() noexcept(false) {
    if (::CloseHandle(_mutex) || std::uncaught_exceptions() != 0) return;
    fail(__LINE__, "CloseHandle", ::GetLastError());
}

bool LkNamedMutexWindows::lock() {
    const DWORD result = ::WaitForSingleObject(_mutex, INFINITE);
    if (result == WAIT_ABANDONED) {
        unlock();
        fail(__LINE__, "WaitForSingleObject", ERROR_ABANDONED_WAIT_0);
    }
    if (result != WAIT_OBJECT_0) fail(__LINE__, "WaitForSingleObject", ::GetLastError());
    return true;
}

void LkNamedMutexWindows::unlock() {
    if (!::ReleaseMutex(_mutex)) fail(__LINE__, "ReleaseMutex", ::GetLastError());
}

}  // namespace Orv
