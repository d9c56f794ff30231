#pragma once

#include <atomic>
#include <vector>

#include "liString.h"
#include "lkMutex.h"
#include "mtThread.h"
#include "objPtr.h"
#include "priority.h"
#include "resmgtApi.h"
#include "threadSafety.h"

namespace Orv {

/// A fixed number of threads that run one loop: obtainTask(), performTask(), doneTask(), until the
/// pool is stopped. What these do is up to the derived class; MtTaskPool is a ready one.
///
/// - Threads: every member by any thread; start() and stop() at once take turns. Workers call the
///   virtual functions with no lock held.
/// - A derived class stops the pool in its own destructor: destroying one that runs aborts the
///   process with a message.
class ORV_RESMGT_API MtThreadPool {
public:
    /// @param name  the workers are called "<name> 0", "<name> 1" and so on.
    /// @param placeOnProcessors  worker i runs on processor i, where that can be had.
    /// @param stackSize  of each worker, in bytes; 0 is MtThread::DEFAULT_STACK_SIZE.
    MtThreadPool(const LiString& name, unsigned nbThreads, bool placeOnProcessors,
                 unsigned stackSize);
    virtual ~MtThreadPool();

    MtThreadPool(const MtThreadPool&) = delete;
    MtThreadPool& operator=(const MtThreadPool&) = delete;

    /// Returns when all workers run; at once if they do already.
    /// @throws what hinders a worker; those that had been started are stopped again.
    void start();

    /// Returns when all workers have ended; at once if none runs. On a worker it asserts.
    /// @throws the first of what workers threw, when all have ended.
    void stop();

    /// From the beginning of start() to that of stop(), or until the workers are asked to stop
    /// otherwise, as by InPackageInit::shutdownAll().
    bool isRunning() const noexcept { return _isRunning.load(std::memory_order_acquire); }

    const LiString& getName() const noexcept { return _name; }
    unsigned getNbThreads() const noexcept { return static_cast<unsigned>(_threads.size()); }

    /// The workers' priority: relate it to others.
    Priority& getPriority() noexcept { return _priority; }

protected:
    static constexpr unsigned NO_WORKER = ~0U;

    unsigned findWorker() const noexcept;  ///< Which worker calls; NO_WORKER if it is none.

    // Called by the worker, in this order; what they throw ends it, and stop() throws it again.
    virtual void obtainTask(unsigned worker);
    virtual void performTask(unsigned worker);  ///< To be overridden: here it aborts.
    virtual void doneTask(unsigned worker);

    /// Wakes the workers, which are to end: once for each start, after isRunning() has become false.
    /// A worker may come to obtainTask() only afterwards and must not wait there then.
    virtual void stopThreads();

    // Called by start(), before the first worker is started and when all were.
    virtual void prepareThreads();
    virtual void threadsStarted();

private:
    class PoolWorker;

    const LiString _name;
    const bool _placesOnProcessors;
    std::atomic<bool> _isRunning{false};
    const LkMutex _control{"MtThreadPool"};         // held by start() and stop() from end to end
    const LkMutex _stopping{"MtThreadPool::stop"};  // held while stopThreads() is called
    bool _hasStarted ORV_GUARDED_BY(_control) = false;  // workers are to be joined
    Priority _priority;
    std::vector<ObjPtr<MtThread>> _threads;

    [[noreturn]] void abortDestroyed() const;
    void runWorker(unsigned worker);
    void askToStop();
    void stopNoLock() ORV_REQUIRES(_control);
    void startNoLock() ORV_REQUIRES(_control);
};

}  // namespace Orv
