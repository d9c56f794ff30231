#pragma once

#include "mtThreadLevels.h"

namespace Orv {

/// MtThreadMgr's part of the system. Here classes belong to threads, so what is left to ask is
/// whether the process may use real time.
class MtThreadMgrPosix {
public:
    MtThreadMgrPosix();

    void enableRealTime();  ///< @throws MtEx::ExRealTimeNotEnabled
    void disableRealTime() noexcept {}
    [[noreturn]] void throwNotEnabled() const;  ///< For threads that are not in the class now.
    MtThreadLevels::ProcessClass getProcessClass(bool isRealTime) const noexcept;
};

}  // namespace Orv
