#include "mtThreadMgrPosix.h"

#include <cerrno>

#include "mtEx.h"
#include "mtSchedulerPosix.h"
#include "osError.h"
#include "sourceFile.h"

namespace Orv {

// The nice value of level 3 is the one before anything was changed.
MtThreadMgrPosix::MtThreadMgrPosix() {
    static_cast<void>(MtSchedulerPosix::getStartNice());
}

void MtThreadMgrPosix::enableRealTime() {
    const int error = MtSchedulerPosix::probeRealTime();
    if (error == 0) return;
    throw MtEx::ExRealTimeNotEnabled(ORV_FILE, __LINE__, OsError::getText(error));
}

void MtThreadMgrPosix::throwNotEnabled() const {
    throw MtEx::ExRealTimeNotEnabled(ORV_FILE, __LINE__, OsError::getText(EPERM));
}

MtThreadLevels::ProcessClass MtThreadMgrPosix::getProcessClass(bool isRealTime) const noexcept {
    using ProcessClass = MtThreadLevels::ProcessClass;
    return isRealTime ? ProcessClass::REAL_TIME : ProcessClass::NORMAL;
}

}  // namespace Orv
