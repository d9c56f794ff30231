#pragma once

#include "rcBase.h"
#include "resmgtApi.h"

namespace Orv {

/// Work for an MtTaskPool: derive from it, or take MtTask::create() for a function.
///
/// - Threads: runs on a worker of the pool; if it is submitted again before it is done, on several at
///   once.
/// - Ownership: shared by the tasks that hold it.
class ORV_RESMGT_API MtTaskImp : public RCBase<LkCounter<long>> {
public:
    ~MtTaskImp() override;

    /// Does the work. What it throws is traced.
    virtual void performTask() = 0;

protected:
    MtTaskImp() = default;
};

}  // namespace Orv
