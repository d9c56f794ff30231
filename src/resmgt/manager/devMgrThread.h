#pragma once

#include <atomic>

#include "devMgrFifo.h"
#include "mtThread.h"
#include "objPtr.h"
#include "priorityRelation.h"
#include "rcShdPtr.h"

namespace Orv {

/// The thread of a manager, "DevMgr ANO": takes notifications out of the manager's queue and
/// delivers them, one at a time and in order. Running from construction to destruction.
///
/// - Destroying it delivers what is in the queue, and returns when the thread has ended. On the
///   thread itself that is an assertion; the thread then ends after the present notification.
/// - A notification that throws ends the thread: the exception is traced, and whoever posts
///   afterwards gets DevMgrEx::ThreadEnded.
class ORV_RESMGT_API DevMgrThread {
public:
    explicit DevMgrThread(RCShdPtr<DevMgrFifo> fifo);
    ~DevMgrThread() noexcept(false);

    DevMgrThread(const DevMgrThread&) = delete;
    DevMgrThread& operator=(const DevMgrThread&) = delete;

    bool isCurrentThread() const noexcept { return _thread->isCurrentThread(); }

private:
    class ANOThreadProtocol;
    class SynchronizedCloseANO;

    const RCShdPtr<DevMgrFifo> _fifo;
    ObjPtr<MtThread> _thread;
    ObjPtr<PriorityRelation> _priorityRelation;

    void close();
    void abandon();
};

}  // namespace Orv
