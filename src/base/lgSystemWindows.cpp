#include "lgSystemWindows.h"

#include <cstdlib>
#include <initializer_list>
#include <windows.h>

namespace Orv {

std::uint64_t LgSystemWindows::getThreadId() noexcept {
    return ::GetCurrentThreadId();
}

std::uint64_t LgSystemWindows::getThreadToken() noexcept {
    return ::GetCurrentThreadId();
}

std::uint64_t LgSystemWindows::getProcessId() noexcept {
    return ::GetCurrentProcessId();
}

// In a DLL std::atexit() means the DLL's end, when the system has stopped all other threads
// wherever they were. The runtime's own list of handlers comes before that.
void LgSystemWindows::callAtExit(void (*handler)()) noexcept {
    struct List {
        const wchar_t* library;
        const char* function;
    };
    for (const List& list :
         {List{L"msvcrt.dll", "_onexit"}, List{L"ucrtbase.dll", "_crt_atexit"}}) {
        const HMODULE library = ::GetModuleHandleW(list.library);
        if (library == nullptr) continue;
        void* const function = reinterpret_cast<void*>(::GetProcAddress(library, list.function));
        if (function != nullptr) reinterpret_cast<void (*)(void (*)())>(function)(handler);
    }
    std::atexit(handler);
}

void LgSystemWindows::toUtc(std::time_t time, std::tm& utc) noexcept {
    ::_gmtime64_s(&utc, &time);
}

}  // namespace Orv
