// clang-format off: in this order
#include <windows.h>
#include <psapi.h>
#include <tlhelp32.h>
// clang-format on

#include "processUsage.h"

namespace Orv {

namespace {

std::size_t countThreads() {
    std::size_t nbThreads = 0;
    const HANDLE snapshot = ::CreateToolhelp32Snapshot(TH32CS_SNAPTHREAD, 0);
    THREADENTRY32 entry{};
    entry.dwSize = sizeof entry;
    for (BOOL isThere = ::Thread32First(snapshot, &entry); isThere;
         isThere = ::Thread32Next(snapshot, &entry)) {
        if (entry.th32OwnerProcessID == ::GetCurrentProcessId()) ++nbThreads;
    }
    ::CloseHandle(snapshot);
    return nbThreads;
}

}  // namespace

ProcessUsage ProcessUsage::take() {
    DWORD nbHandles = 0;
    ::GetProcessHandleCount(::GetCurrentProcess(), &nbHandles);
    PROCESS_MEMORY_COUNTERS_EX memory{};
    memory.cb = sizeof memory;
    ::K32GetProcessMemoryInfo(::GetCurrentProcess(),
                              reinterpret_cast<PROCESS_MEMORY_COUNTERS*>(&memory), sizeof memory);
    return {nbHandles, countThreads(), memory.PrivateUsage};
}

}  // namespace Orv
