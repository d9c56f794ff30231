#pragma once

#include "priority.h"
#include "resmgtApi.h"

namespace Orv {

class MtThread;

/// A thread's node among the priorities of MtPriorityMgr: relate it to others to say how urgent the
/// thread is. The thread follows its number, unless its level was set by hand.
///
/// - Threads: as Priority.
/// - Ownership: part of the thread.
class ORV_RESMGT_API MtThreadPriority : public Priority {
public:
    explicit MtThreadPriority(MtThread& thread);
    ~MtThreadPriority() override;

private:
    MtThread& _thread;

    void updatePriority(int number) override;
};

}  // namespace Orv
