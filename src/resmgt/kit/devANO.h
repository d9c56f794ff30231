#pragma once

#include "devACO.h"
#include "objPtr.h"

namespace Orv {

/// Asynchronous notification object: one request, or one piece of news, that knows how to carry
/// itself out on the thread that takes it from a queue.
///
/// Derive from it, implement performExecute(), and put it into a DevANOQueueEntry.
class ORV_RESMGT_API DevANO : public DevAEO {
public:
    ~DevANO() override;

    /// Replaces, and destroys, the completion object of before.
    void setACO(ObjPtr<DevACO> aco);
    ObjPtrRet<DevACO> releaseACO();  ///< Hands it out; none is left.

    /// Runs the completion object, if there is one, and destroys it, also if it throws.
    void notify();

private:
    ObjPtr<DevACO> _aco;
};

}  // namespace Orv
