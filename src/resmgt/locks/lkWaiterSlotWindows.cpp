#include "lkWaiterSlotWindows.h"

#include <windows.h>

#include "assertions.h"
#include "osError.h"

namespace Orv {

namespace {

char ended;  // its address says that the thread's end was noticed
LkWaiterSlotWindows::GiveBack giveBackWaiter = nullptr;

struct Slots {
    DWORD value;
    DWORD end;  // holds the value, too, and has a callback for the thread's end
};

void WINAPI noticeEnd(void* waiter);

const Slots& getSlots() {
    static const Slots slots = [] {
        const Slots made{::TlsAlloc(), ::FlsAlloc(noticeEnd)};
        ORV_ASSERT_SYS(made.value != TLS_OUT_OF_INDEXES && made.end != FLS_OUT_OF_INDEXES,
                       "::TlsAlloc() != TLS_OUT_OF_INDEXES", OsError::getLast());
        return made;
    }();
    return slots;
}

void WINAPI noticeEnd(void* waiter) {
    if (waiter == nullptr) return;
    ::TlsSetValue(getSlots().value, &ended);
    giveBackWaiter(*static_cast<LkWaiter*>(waiter));
}

/// TlsGetValue() clears the thread's last error, which the caller may still want to read.
void* getValue() {
    const DWORD error = ::GetLastError();
    void* const value = ::TlsGetValue(getSlots().value);
    ::SetLastError(error);
    return value;
}

}  // namespace

LkWaiter* LkWaiterSlotWindows::get() noexcept {
    void* const value = getValue();
    return value == &ended ? nullptr : static_cast<LkWaiter*>(value);
}

bool LkWaiterSlotWindows::set(LkWaiter& waiter, GiveBack giveBack) {
    if (getValue() == &ended) return false;
    giveBackWaiter = giveBack;
    ORV_ASSERT_SYS(::FlsSetValue(getSlots().end, &waiter), "::FlsSetValue( _end, waiter )",
                   OsError::getLast());
    ORV_ASSERT_SYS(::TlsSetValue(getSlots().value, &waiter), "::TlsSetValue( _value, waiter )",
                   OsError::getLast());
    return true;
}

}  // namespace Orv
