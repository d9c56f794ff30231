#include "mtThreadFactoryWinNT.h"

// clang-format off: in this order
#include <windows.h>
#include <tlhelp32.h>
// clang-format on

namespace Orv {

namespace {

/// 0 if the thread has ended.
unsigned long long getCreationTime(DWORD threadId) noexcept {
    const HANDLE thread = ::OpenThread(THREAD_QUERY_LIMITED_INFORMATION, FALSE, threadId);
    if (thread == nullptr) return 0;
    FILETIME created{}, ended{}, kernel{}, user{};
    const BOOL isKnown = ::GetThreadTimes(thread, &created, &ended, &kernel, &user);
    ::CloseHandle(thread);
    return isKnown ? (DWORD64{created.dwHighDateTime} << 32 | created.dwLowDateTime) : 0;
}

}  // namespace

/// The system does not say which thread was the first; it says when each was made.
bool MtThreadFactoryWinNT::isOnMainThread() noexcept {
    const DWORD self = ::GetCurrentThreadId();
    const unsigned long long ownTime = getCreationTime(self);
    const HANDLE snapshot = ::CreateToolhelp32Snapshot(TH32CS_SNAPTHREAD, 0);
    if (snapshot == INVALID_HANDLE_VALUE) return false;
    bool isFirst = true;
    THREADENTRY32 entry{};
    entry.dwSize = sizeof entry;
    for (BOOL isThere = ::Thread32First(snapshot, &entry); isThere && isFirst;
         isThere = ::Thread32Next(snapshot, &entry)) {
        if (entry.th32OwnerProcessID != ::GetCurrentProcessId()) continue;
        if (entry.th32ThreadID == self) continue;
        const unsigned long long time = getCreationTime(entry.th32ThreadID);
        if (time != 0 && time < ownTime) isFirst = false;
    }
    ::CloseHandle(snapshot);
    return isFirst;
}

}  // namespace Orv
