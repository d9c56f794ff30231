#pragma once

#include "mtThreadLevels.h"

namespace Orv {

/// MtThreadMgr's part of the system: the priority class of the process.
class MtThreadMgrWinNT {
public:
    MtThreadMgrWinNT();

    void enableRealTime();  ///< @throws MtEx::ExRealTimeNotEnabled with the class as it was.
    void disableRealTime();
    [[noreturn]] void throwNotEnabled() const;  ///< For threads that are not in the class now.
    MtThreadLevels::ProcessClass getProcessClass(bool isRealTime) const;

private:
    void* _processHandle;
};

}  // namespace Orv
