#include <windows.h>
// The tool help needs the types of windows.h.
#include <cstdio>
#include <string>
#include <tlhelp32.h>

#include "threadStacks.h"

namespace Orv {

namespace {

/// The name a thread was given; empty where it has none or the system knows no names.
std::wstring nameOf(HANDLE thread) {
    using Function = HRESULT(WINAPI*)(HANDLE, PWSTR*);
    const auto getDescription = reinterpret_cast<Function>(reinterpret_cast<void*>(
        ::GetProcAddress(::GetModuleHandleA("kernel32"), "GetThreadDescription")));
    PWSTR text = nullptr;
    if (getDescription == nullptr || FAILED(getDescription(thread, &text))) return {};
    const std::wstring name = text;
    ::LocalFree(text);
    return name;
}

/// "lkTests.exe+0x1234", for addr2line with the image base added.
void writeFrame(DWORD64 address) {
    HMODULE module = nullptr;
    char path[MAX_PATH] = "?";
    ::GetModuleHandleExA(
        GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
        reinterpret_cast<LPCSTR>(address), &module);
    ::GetModuleFileNameA(module, path, sizeof(path));
    const std::string file(path);
    std::fprintf(stderr, "    %s+0x%llx\n", file.substr(file.find_last_of("\\/") + 1).c_str(),
                 address - reinterpret_cast<DWORD64>(module));
}

/// Follows the unwind tables from the thread's registers upwards.
void writeStack(HANDLE thread) {
    CONTEXT context{};
    context.ContextFlags = CONTEXT_FULL;
    if (!::GetThreadContext(thread, &context)) return;
    for (int depth = 0; depth < 64 && context.Rip != 0; ++depth) {
        writeFrame(context.Rip);
        DWORD64 imageBase = 0;
        auto* const function = ::RtlLookupFunctionEntry(context.Rip, &imageBase, nullptr);
        if (function == nullptr) {  // a function that calls nothing: its caller is on top
            context.Rip = *reinterpret_cast<const DWORD64*>(context.Rsp);
            context.Rsp += sizeof(DWORD64);
            continue;
        }
        void* handlerData = nullptr;
        DWORD64 frame = 0;
        ::RtlVirtualUnwind(UNW_FLAG_NHANDLER, imageBase, context.Rip, function, &context,
                           &handlerData, &frame, nullptr);
    }
}

void writeThread(DWORD id) {
    HANDLE thread = ::OpenThread(THREAD_ALL_ACCESS, FALSE, id);
    if (thread == nullptr) return;
    std::fprintf(stderr, "  thread %lu \"%ls\"\n", id, nameOf(thread).c_str());
    // Suspended only while it is read, so that it holds no lock of the C library meanwhile.
    ::SuspendThread(thread);
    writeStack(thread);
    ::ResumeThread(thread);
    ::CloseHandle(thread);
}

}  // namespace

void prepareThreadStacks() {}

void writeThreadStacks() {
    HANDLE snapshot = ::CreateToolhelp32Snapshot(TH32CS_SNAPTHREAD, 0);
    THREADENTRY32 entry{};
    entry.dwSize = sizeof(entry);
    for (BOOL more = ::Thread32First(snapshot, &entry); more;
         more = ::Thread32Next(snapshot, &entry)) {
        const bool isOurs = entry.th32OwnerProcessID == ::GetCurrentProcessId();
        if (isOurs && entry.th32ThreadID != ::GetCurrentThreadId()) writeThread(entry.th32ThreadID);
    }
    ::CloseHandle(snapshot);
}

}  // namespace Orv
