#include "mtThreadEndWindows.h"

#include <windows.h>

#include "assertions.h"
#include "mtSpecificDataRegistry.h"
#include "osError.h"

namespace Orv {

namespace {

char watched;  // any address: what the slot holds for a thread that is watched

void CALLBACK threadEnds(void* value) {
    if (value == nullptr) return;
    try {
        MtSpecificDataRegistry::getInstance().removeSpecificData();
    } catch (...) {
        Assertions::traceCurrentException("deleting the data of a thread that ends");
    }
}

DWORD createSlot() {
    const DWORD slot = ::FlsAlloc(threadEnds);
    ORV_ASSERT_SYS(slot != FLS_OUT_OF_INDEXES,
                   "(slot = ::FlsAlloc( threadEnds )) != FLS_OUT_OF_INDEXES", OsError::getLast());
    return slot;
}

}  // namespace

void MtThreadEndWindows::watchCallingThread() {
    static const DWORD slot = createSlot();
    if (::FlsGetValue(slot) != nullptr) return;
    ORV_ASSERT_SYS(::FlsSetValue(slot, &watched), "::FlsSetValue( slot, &watched )",
                   OsError::getLast());
}

}  // namespace Orv
