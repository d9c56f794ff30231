#include "lgThreadSlotWindows.h"

#include <windows.h>

#include "assertions.h"
#include "osError.h"

namespace Orv {

namespace {

char ended;

}  // namespace

void* const LgThreadSlotWindows::ENDED = &ended;
void (*LgThreadSlotWindows::_threadEnds)(void*) = nullptr;
unsigned long LgThreadSlotWindows::_slot = TLS_OUT_OF_INDEXES;

LgThreadSlotWindows::LgThreadSlotWindows(void (*threadEnds)(void* value)) {
    _threadEnds = threadEnds;
    _slot = ::TlsAlloc();
    ORV_ASSERT_SYS(_slot != TLS_OUT_OF_INDEXES, "(_slot = ::TlsAlloc()) != TLS_OUT_OF_INDEXES",
                   OsError::getLast());
    _endSlot = ::FlsAlloc(notice);
    ORV_ASSERT_SYS(_endSlot != FLS_OUT_OF_INDEXES,
                   "(_endSlot = ::FlsAlloc( notice )) != FLS_OUT_OF_INDEXES", OsError::getLast());
}

void LgThreadSlotWindows::notice(void* value) {
    ::TlsSetValue(_slot, ENDED);
    _threadEnds(value);
}

// TlsGetValue() clears the thread's last error, which the caller may still want to read.
void* LgThreadSlotWindows::get() const noexcept {
    const DWORD error = ::GetLastError();
    void* const value = ::TlsGetValue(_slot);
    ::SetLastError(error);
    return value;
}

void LgThreadSlotWindows::set(void* value) {
    ORV_ASSERT_SYS(::FlsSetValue(_endSlot, value), "::FlsSetValue( _endSlot, value )",
                   OsError::getLast());
    ORV_ASSERT_SYS(::TlsSetValue(_slot, value), "::TlsSetValue( _slot, value )",
                   OsError::getLast());
}

}  // namespace Orv
