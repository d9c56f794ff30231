#pragma once

#include <atomic>
#include <cstdint>
#include <exception>
#include <iosfwd>

#include "liString.h"
#include "lkEvent.h"
#include "lkInPlace.h"
#include "lkRecLock.h"
#include "lkThreadId.h"
#include "lkTimeLimit.h"
#include "lkUnnamedSema.h"
#include "mtThreadLevels.h"
#include "mtThreadPriority.h"
#include "mtThreadProtocol.h"
#include "objPtr.h"
#include "resmgtApi.h"
#include "threadSafety.h"

namespace Orv {

class MtThreadGroup;

/// A thread of the process that runs an MtThreadProtocol; made by MtThreadFactory.
///
/// It counts as running from start() until it has been joined, and may then be started again. It
/// blocks asynchronous signals. What its body throws, of any type, is thrown again by join().
///
/// - Threads: every member may be called by any thread, the thread itself included.
/// - Ownership: owns its protocol. Destroying it while it runs asks it to stop, joins it and traces
///   what its body threw; on the thread itself that is an assertion.
class ORV_RESMGT_API MtThread {
public:
    static constexpr unsigned DEFAULT_STACK_SIZE = 0x10000;
    static constexpr int ANY_PROCESSOR = -1;

    ~MtThread() noexcept(false);
    MtThread(const MtThread&) = delete;
    MtThread& operator=(const MtThread&) = delete;

    // Running

    /// Returns when the thread is about to run its body: named, placed, at its level.
    /// @throws what keeps it from that; it may be started again. Asserts "!isRunningNoLock()" and
    ///   "canStart()".
    void start();

    /// Blocks until the thread has ended; at once if it does not run.
    /// @throws MtEx::ExThrownException, MtEx::ExStdThrownException with what the body threw, to one
    ///   of those that join.
    void join();
    [[nodiscard]] bool timedJoin(double seconds);  ///< The same; false if the time ran out.

    bool isRunning() const noexcept { return _isRunning.load(std::memory_order_acquire); }
    void requestStop();  ///< MtThreadProtocol::performStop(); without a protocol, cancellation.

    static bool canStart() noexcept;  ///< From the package's start until its shutdown.
    static void allowStart(bool isAllowed = true) noexcept;  ///< For the package.

    // Cancellation: the body looks now and then whether it was requested

    /// @param check  asserts that the thread runs; a start forgets earlier requests.
    /// @return whether it was not requested already.
    bool requestCancel(bool check = true);
    bool clearCancel() noexcept;     ///< @return whether it was requested.
    bool isCancelRequested() const;  ///< Asserts "isRunning()".

    /// Allows forceStop(); at first it is not.
    void setCancelable(bool isCancelable);
    bool isCancelable() const;

    /// The last resort: ends the thread where it stands, without unwinding. What it holds stays
    /// held, locks of the C library included, and its thread data is not deleted.
    /// @return false if it could not be done within a second, for instance because the thread
    ///   blocks all signals; the thread then runs on, and may be forced again.
    bool forceStop();

    // Scheduling

    MtThreadPriority& getPriority() noexcept { return _priority; }

    /// 0 (idle) to 6, at first 3, as MtThreadLevels. Set by hand, it no longer follows
    /// getPriority(). A level that the system refuses for want of rights reads back all the same;
    /// the refusal is traced, once in a process.
    void setPriorityLevel(int level);
    int getPriorityLevel() const;
    int getBasePriority() const;  ///< Level and class as one number, 1 to 31.

    /// Places the thread on one of the processors 0 to MtThreadMgr::getNbProcessors() - 1, or on
    /// any. A number that is not placeable takes effect at the next start, if the system allows,
    /// and none does with `ORV_RUNON` 0.
    void setProcessorNb(int number);
    int getProcessorNb() const;
    bool isProcessorPlaceable(int number) const;  ///< While running; never on Windows.

    // Queries

    const LiString& getName() const noexcept { return _name; }
    LkThreadId getThreadId() const;                                ///< None while it does not run.
    unsigned getStackSize() const noexcept { return _stackSize; }  ///< Guaranteed bytes.
    bool isMainThread() const noexcept { return _isMainThread; }
    bool isCurrentThread() const noexcept;
    MtThreadProtocol* getProtocol() const noexcept { return _protocol.get(); }  ///< Or null.
    void dump(std::ostream&) const;                                             ///< One line.

    static void freeSpecificData();  ///< Deletes the thread data of the calling thread.

private:
    friend class MtThreadFactory;
    friend class MtThreadMgr;
    friend class MtThreadMgrImp;
    friend class MtThreadPriority;

    struct Frame;
    class Native;  // MtThreadPosix or MtThreadWindows

    const LiString _name;
    const unsigned _stackSize;
    const bool _isMainThread;
    const bool _terminatesOnUnhandled;
    MtThreadGroup* const _group;  // or null
    const LkRecLock _lock{"MtThreadWindows"};
    LkUnnamedSema _started{"MtThreadWindows::started", 0};
    LkEvent _joinerLeft{"MtThreadWindows::joinerLeft", true};  // reset while somebody joins
    std::atomic<bool> _isRunning{false};
    std::atomic<bool> _isCancelRequested{false};

    LkInPlace<Native, 96> _native;

    // Up to the handshake the new thread uses these in the name of its starter, who holds the lock.
    std::uint64_t _run ORV_GUARDED_BY(_lock) = 0;          // counts starts
    std::exception_ptr _startError;                        // of a run that did not reach its body
    std::uintptr_t _dataNumber ORV_GUARDED_BY(_lock) = 0;  // in MtSpecificDataRegistry
    bool _isForced ORV_GUARDED_BY(_lock) = false;
    bool _isBeingJoined ORV_GUARDED_BY(_lock) = false;
    bool _isCancelable ORV_GUARDED_BY(_lock) = false;
    bool _isLevelByHand ORV_GUARDED_BY(_lock) = false;
    bool _isLevelRefused ORV_GUARDED_BY(_lock) = false;
    int _level ORV_GUARDED_BY(_lock) = MtThreadLevels::NORMAL_LEVEL;
    int _processorNb ORV_GUARDED_BY(_lock) = ANY_PROCESSOR;

    // Taken by the thread when it leaves, which is not to wait for its starter. What is done with
    // the system's thread is done under it.
    const LkRecLock _endLock{"MtThread::endLock"};
    std::exception_ptr _thrown ORV_GUARDED_BY(_endLock);  // of the last run, until it was joined
    bool _hasEnded ORV_GUARDED_BY(_endLock) = false;      // on its way out, though not joined

    ObjPtr<MtThreadProtocol> _protocol;  // may be null
    MtThreadPriority _priority;

    MtThread(const LiString& name, ObjPtr<MtThreadProtocol> protocol, MtThreadGroup* group,
             bool isMainThread, bool terminatesOnUnhandled, unsigned stackSize);

    void adoptCurrentThread();
    void leaveOwners() noexcept;
    void stopAndJoin() noexcept;
    void giveProtocolBack() noexcept;

    void waitForEntry();
    static MtThread* findCurrent() noexcept;
    static void execute(void* data);
    bool enter(Frame& frame) noexcept ORV_NO_THREAD_SAFETY_ANALYSIS;
    void placeAtStart() ORV_REQUIRES(_lock);
    static void runBody(Frame& frame);
    static void finish(Frame& frame);
    void end(const std::exception_ptr& thrown);

    bool isRunningNoLock() const noexcept { return isRunning(); }
    bool isAliveNoLock() const noexcept ORV_REQUIRES(_lock, _endLock) {
        return isRunningNoLock() && !_hasEnded && !_isForced;
    }
    bool joinWithin(const LkTimeLimit& limit);
    bool waitForEnd(const LkTimeLimit& limit, std::uint64_t& run);
    bool waitForJoiner(const LkTimeLimit& limit);
    void noteEndNoLock() ORV_REQUIRES(_lock);
    bool tryForceStop();
    void throwThrown(std::uint64_t run);
    void traceThrown() noexcept;

    void followLevel();
    void followPriority(int level);
    bool applyLevelNoLock() ORV_REQUIRES(_lock);
    bool applyClass(bool isRealTime);
    static void traceLevelRefusal(const LiString& thread);
};

}  // namespace Orv
