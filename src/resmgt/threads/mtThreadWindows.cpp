#include "mtThreadWindows.h"

#include <string>
#include <windows.h>

#include "assertions.h"
#include "mtThreadLevels.h"
#include "osError.h"

namespace Orv {

namespace {

/// A function of a system library, or null where the system does not have it.
template <class Function>
Function find(const char* library, const char* name) noexcept {
    const HMODULE module = ::GetModuleHandleA(library);
    if (module == nullptr) return nullptr;
    return reinterpret_cast<Function>(reinterpret_cast<void*>(::GetProcAddress(module, name)));
}

std::wstring widen(const char* text) {
    const int length = ::MultiByteToWideChar(CP_UTF8, 0, text, -1, nullptr, 0);
    std::wstring wide(static_cast<std::size_t>(length > 0 ? length : 1), L'\0');
    ::MultiByteToWideChar(CP_UTF8, 0, text, -1, wide.data(), length);
    return wide;
}

}  // namespace

bool MtThreadWindows::isProcessEnding() noexcept {
    using IsEnding = BOOLEAN(NTAPI*)();
    static const auto isEnding = find<IsEnding>("ntdll.dll", "RtlDllShutdownInProgress");
    return isEnding != nullptr && isEnding();
}

unsigned long __stdcall MtThreadWindows::executeCb(void* native) {
    const MtThreadWindows& self = *static_cast<MtThreadWindows*>(native);
    self._entry(self._data);
    return 0;
}

void MtThreadWindows::create(unsigned stackSize, Entry entry, void* data) {
    _entry = entry;
    _data = data;
    // The size is what the system commits; it reserves 1 MiB at least.
    _threadHandle = ::CreateThread(nullptr, stackSize, executeCb, this, 0, &_threadId);
    ORV_ASSERT_SYS(_threadHandle != nullptr,
                   "(_threadHandle = ::CreateThread( NULL, _stackSize, ( LPTHREAD_START_ROUTINE ) "
                   "executeCb, ( LPVOID ) this, 0, &_threadId ) ) != NULL",
                   OsError::getLast());
}

void MtThreadWindows::enter() {
    _id.setCurrentThread();
}

void MtThreadWindows::adoptCurrent() {
    const HANDLE pseudoHandle = ::GetCurrentThread();
    ORV_ASSERT_SYS(pseudoHandle != nullptr, "pseudoHandle != NULL", OsError::getLast());
    const HANDLE hProcess = ::GetCurrentProcess();
    ORV_ASSERT_SYS(hProcess != nullptr, "hProcess != NULL", OsError::getLast());
    ORV_ASSERT_SYS(::DuplicateHandle(hProcess, pseudoHandle, hProcess, &_threadHandle, 0, FALSE,
                                     DUPLICATE_SAME_ACCESS),
                   "::DuplicateHandle( hProcess, pseudoHandle, hProcess, &_threadHandle, 0, 0, "
                   "DUPLICATE_SAME_ACCESS )",
                   OsError::getLast());
    _id.setCurrentThread();
}

bool MtThreadWindows::waitForEnd(const LkTimeLimit& limit) {
    const DWORD waitResult = ::WaitForSingleObject(_threadHandle, limit.getRemainingMilliseconds());
    if (waitResult == WAIT_TIMEOUT && !limit.isInfinite()) return false;
    ORV_ASSERT_SYS(waitResult == WAIT_OBJECT_0, "waitResult == WAIT_OBJECT_0", OsError::getLast());
    return true;
}

void MtThreadWindows::release() noexcept {
    if (_threadHandle != nullptr) ::CloseHandle(_threadHandle);
    _threadHandle = nullptr;
    _threadId = 0;
    _id.reset();
}

bool MtThreadWindows::terminate() {
    ORV_ASSERT_SYS(::TerminateThread(_threadHandle, 0), "::TerminateThread( _threadHandle, 0 )",
                   OsError::getLast());
    return waitForEnd(LkTimeLimit(1.0));
}

/// Debuggers and profilers show it; Windows before version 10 cannot.
void MtThreadWindows::setName(const char* name) noexcept {
    using SetDescription = HRESULT(WINAPI*)(HANDLE, PCWSTR);
    static const auto setDescription = find<SetDescription>("kernel32.dll", "SetThreadDescription");
    if (setDescription == nullptr) return;
    try {
        setDescription(::GetCurrentThread(), widen(name).c_str());
    } catch (const std::bad_alloc&) {
        // The thread works without a name, too.
    }
}

/// A new thread gets here before its starter has stored the handle.
MtThreadWindows::Handle MtThreadWindows::getTarget() const noexcept {
    return _id.isCurrentThread() ? ::GetCurrentThread() : _threadHandle;
}

bool MtThreadWindows::applyLevel(int level, bool) {
    const int _priorityValue = MtThreadLevels::toThreadPriority(level);
    ORV_ASSERT_SYS(::SetThreadPriority(getTarget(), _priorityValue),
                   "::SetThreadPriority( _threadHandle, _priorityValue )", OsError::getLast());
    return true;
}

int MtThreadWindows::readLevel(int) const {
    const int threadPriority = ::GetThreadPriority(getTarget());
    ORV_ASSERT_SYS(threadPriority != THREAD_PRIORITY_ERROR_RETURN,
                   "::GetThreadPriority( _threadHandle ) != THREAD_PRIORITY_ERROR_RETURN",
                   OsError::getLast());
    return MtThreadLevels::toLevel(threadPriority);
}

bool MtThreadWindows::isRealTime() const {
    return ::GetPriorityClass(::GetCurrentProcess()) == REALTIME_PRIORITY_CLASS;
}

void MtThreadWindows::setProcessor(int number) {
    DWORD_PTR threadAffinity = 0;
    DWORD_PTR systemAffinity = 0;
    const HANDLE processHandle = ::GetCurrentProcess();
    ORV_ASSERT_SYS(::GetProcessAffinityMask(processHandle, &threadAffinity, &systemAffinity),
                   "::GetProcessAffinityMask( processHandle, &threadAffinity, &systemAffinity )",
                   OsError::getLast());
    if (number >= 0) {
        // The processors of the process are numbered from 0, whichever these are.
        for (int i = 0; i < number; ++i) threadAffinity &= threadAffinity - 1;
        threadAffinity &= ~(threadAffinity - 1);
        ORV_ASSERT_TEXT(threadAffinity != 0, "number < getNumber()");
    }
    ORV_ASSERT_SYS(::SetThreadAffinityMask(getTarget(), threadAffinity),
                   "::SetThreadAffinityMask( _threadHandle, threadAffinity )", OsError::getLast());
}

}  // namespace Orv
