#include "mtThreadMgrWinNT.h"

#include <windows.h>

#include "assertions.h"
#include "mtEx.h"
#include "osError.h"

namespace Orv {

MtThreadMgrWinNT::MtThreadMgrWinNT() {
    ORV_ASSERT_SYS((_processHandle = ::GetCurrentProcess()) != nullptr,
                   "(_processHandle = ::GetCurrentProcess()) != NULL", OsError::getLast());
}

/// Without the right to it the system puts the process into a lower class and reports success.
void MtThreadMgrWinNT::enableRealTime() {
    const DWORD before = ::GetPriorityClass(_processHandle);
    if (!::SetPriorityClass(_processHandle, REALTIME_PRIORITY_CLASS)) {
        throw MtEx::ExRealTimeNotEnabled(ORV_FILE, __LINE__, OsError::getText(OsError::getLast()));
    }
    if (::GetPriorityClass(_processHandle) == REALTIME_PRIORITY_CLASS) return;
    ::SetPriorityClass(_processHandle, before);
    throwNotEnabled();
}

void MtThreadMgrWinNT::disableRealTime() {
    ORV_ASSERT_SYS(::SetPriorityClass(_processHandle, NORMAL_PRIORITY_CLASS),
                   "::SetPriorityClass( _processHandle, NORMAL_PRIORITY_CLASS )",
                   OsError::getLast());
}

void MtThreadMgrWinNT::throwNotEnabled() const {
    throw MtEx::ExRealTimeNotEnabled(ORV_FILE, __LINE__,
                                     OsError::getText(ERROR_PRIVILEGE_NOT_HELD));
}

MtThreadLevels::ProcessClass MtThreadMgrWinNT::getProcessClass(bool) const {
    using ProcessClass = MtThreadLevels::ProcessClass;
    switch (::GetPriorityClass(_processHandle)) {
        case IDLE_PRIORITY_CLASS:
            return ProcessClass::IDLE;
        case BELOW_NORMAL_PRIORITY_CLASS:
            return ProcessClass::BELOW_NORMAL;
        case NORMAL_PRIORITY_CLASS:
            return ProcessClass::NORMAL;
        case ABOVE_NORMAL_PRIORITY_CLASS:
            return ProcessClass::ABOVE_NORMAL;
        case HIGH_PRIORITY_CLASS:
            return ProcessClass::HIGH;
        case REALTIME_PRIORITY_CLASS:
            return ProcessClass::REAL_TIME;
        default:
            Assertions::throwProgramAborted(ORV_FILE, __LINE__, "a process has one of six classes");
    }
}

}  // namespace Orv
