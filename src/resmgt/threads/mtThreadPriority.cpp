#include "mtThreadPriority.h"

#include "mtPriorityMgr.h"
#include "mtThread.h"

namespace Orv {

MtThreadPriority::MtThreadPriority(MtThread& thread)
    : Priority(thread.getName(), MtPriorityMgr::getInstance()), _thread(thread) {}

MtThreadPriority::~MtThreadPriority() {
    getMgr().remove(*this);
}

void MtThreadPriority::updatePriority(int number) {
    _thread.followPriority(MtPriorityMgr::toLevel(number, isTied()));
}

}  // namespace Orv
