#include "mtThread.h"

#include <cstdlib>
#include <cxxabi.h>
#include <ostream>
#include <utility>

#include "assertions.h"
#include "lgRegistry.h"
#include "mtEx.h"
#include "mtNative.h"
#include "mtSpecificDataRegistry.h"
#include "mtThreadGroup.h"
#include "mtThreadLevels.h"
#include "mtThreadMgr.h"
#include "mtThreadMgrImpPrivate.h"
#include "mtUtil.h"
#include "threadSlot.h"
#include "trace.h"
#include "traceManager.h"

namespace Orv {

/// A run of a thread, on that thread's stack; what is current for the thread.
struct MtThread::Frame {
    MtThread* thread;                     // null once the object has gone, on its own thread
    std::exception_ptr thrown{};          // the first of all
    ObjPtr<MtThreadProtocol> orphaned{};  // of an object that has gone

    ~Frame() { current.set(nullptr); }

    /// Does a step of the end. Only the C library's own unwinding keeps it from the next one.
    template <class Step>
    void attempt(Step step) {
        try {
            step();
        } catch (const abi::__forced_unwind&) {
            throw;
        } catch (...) {
            if (!thrown) thrown = std::current_exception();
        }
    }

    static Frame* find() noexcept { return static_cast<Frame*>(current.get()); }

    static constinit inline ThreadSlot current{ThreadSlot::THREADS};
};

namespace {

std::atomic<bool> isStartAllowed{false};

constexpr double LONGEST_FORCED_STOP_SECONDS = 1.0;

}  // namespace

// Life

MtThread::MtThread(const LiString& name, ObjPtr<MtThreadProtocol> protocol, MtThreadGroup* group,
                   bool isMainThread, bool terminatesOnUnhandled, unsigned stackSize)
    : _name(name),
      _stackSize(stackSize != 0 ? stackSize : DEFAULT_STACK_SIZE),
      _isMainThread(isMainThread),
      _terminatesOnUnhandled(terminatesOnUnhandled),
      _group(group),
      _protocol(std::move(protocol)),
      _priority(*this) {
    try {
        MtThreadMgr::get().imp().getThreads().add(*this);
        if (_group != nullptr) _group->add(*this);
        if (_isMainThread) adoptCurrentThread();
        if (_protocol) _protocol->performAttach(this);
    } catch (...) {
        leaveOwners();
        throw;
    }
}

MtThread::~MtThread() noexcept(false) {
    const bool isOnItself = isCurrentThread() && !_isMainThread;
    if (isOnItself) {
        const LkGuard starterHasLeft(_lock);
        _native->detach();
    } else if (!_isMainThread) {
        stopAndJoin();
    }
    leaveOwners();
    giveProtocolBack();
    if (Frame* const frame = isCurrentThread() ? Frame::find() : nullptr) {
        frame->thread = nullptr;
        frame->orphaned = std::move(_protocol);  // its body still runs
    }
    ORV_ASSERT_IN_DESTRUCTOR(!isOnItself);
}

void MtThread::adoptCurrentThread() {
    static Frame* const frame = new Frame{nullptr};
    _native->adoptCurrent();
    frame->thread = this;
    Frame::current.set(frame);
    LgRegistry::getInstance().registerThread(_name.getText());
    _isRunning.store(true, std::memory_order_release);
}

/// Returns when nobody goes through the thread any more.
void MtThread::leaveOwners() noexcept {
    if (_group != nullptr) _group->remove(*this);
    MtThreadMgr::get().imp().getThreads().remove(*this);
}

void MtThread::stopAndJoin() noexcept {
    try {
        if (isRunning()) requestStop();
        std::uint64_t run = 0;
        static_cast<void>(waitForEnd(LkTimeLimit(), run));
    } catch (...) {
        Assertions::traceCurrentException("destroying a thread that runs");
    }
    traceThrown();
}

void MtThread::giveProtocolBack() noexcept {
    if (!_protocol) return;
    try {
        _protocol->performDetach(this);
    } catch (...) {
        Assertions::traceCurrentException("detaching the protocol of a thread");
    }
}

// Running: the starter's side

void MtThread::start() {
    followLevel();
    LkGuard guard(_lock);
    ORV_ASSERT(!isRunningNoLock());
    ORV_ASSERT(canStart());
    traceThrown();
    ++_run;
    _isForced = _isLevelRefused = false;
    {
        const LkGuard endGuard(_endLock);
        _hasEnded = false;
    }
    _native->create(_stackSize, execute, this);
    waitForEntry();
    if (_startError) {
        static_cast<void>(_native->waitForEnd(LkTimeLimit()));
        _native->release();
        std::rethrow_exception(std::exchange(_startError, nullptr));
    }
    if (!_isLevelRefused) return;
    const LiString name = _name;
    guard.unlock();  // the body may destroy the object from here on
    traceLevelRefusal(name);
}

/// A starter that gives way, while the new thread has only its processor to run on, finds it farther
/// when it comes back; one that sleeps is woken by the handshake and pushes the thread aside again.
void MtThread::waitForEntry() {
    constexpr int nbYields = 2;
    for (int i = 0; i < nbYields; ++i) {
        if (_started.tryWait()) return;
        MtUtil::yield();
    }
    _started.wait();
}

void MtThread::join() {
    static_cast<void>(joinWithin(LkTimeLimit()));
}

bool MtThread::timedJoin(double seconds) {
    return joinWithin(LkTimeLimit(seconds));
}

bool MtThread::joinWithin(const LkTimeLimit& limit) {
    ORV_ASSERT(!_isMainThread);
    ORV_ASSERT(!isCurrentThread());
    std::uint64_t run = 0;
    if (!waitForEnd(limit, run)) return false;
    throwThrown(run);
    return true;
}

/// Of those who wait, one at a time waits for the system's thread, the others for that one.
/// @param run  set to the run that was waited for.
bool MtThread::waitForEnd(const LkTimeLimit& limit, std::uint64_t& run) {
    LkGuard guard(_lock);
    run = _run;
    while (isRunningNoLock() && _run == run) {
        if (_isBeingJoined) {
            guard.unlock();
            if (!waitForJoiner(limit)) return false;
            guard.lock();
            continue;
        }
        _isBeingJoined = true;
        _joinerLeft.reset();
        guard.unlock();
        std::exception_ptr error;
        bool hasEnded = false;
        try {
            hasEnded = _native->waitForEnd(limit);
        } catch (...) {
            error = std::current_exception();
        }
        guard.lock();
        _isBeingJoined = false;
        if (hasEnded) noteEndNoLock();
        _joinerLeft.set();
        if (error) std::rethrow_exception(error);
        if (!hasEnded) return false;
    }
    return true;
}

bool MtThread::waitForJoiner(const LkTimeLimit& limit) {
    if (!limit.isInfinite())
        return _joinerLeft.timedWait(limit.getRemainingMilliseconds() / 1000.0);
    _joinerLeft.wait();
    return true;
}

void MtThread::noteEndNoLock() {
    _native->release();
    if (_isForced) MtSpecificDataRegistry::getInstance().forgetThread(_dataNumber);
    _isRunning.store(false, std::memory_order_release);
}

void MtThread::throwThrown(std::uint64_t run) {
    std::exception_ptr thrown;
    {
        const LkGuard guard(_lock);
        const LkGuard endGuard(_endLock);
        if (_run != run || !_thrown) return;
        thrown = std::exchange(_thrown, nullptr);
    }
    ORV_TRACE(TraceLevel::getMain())
        << "Thread \"" << _name << "\" ended with an exception: " << MtEx::describe(thrown);
    MtEx::throwThrown(ORV_FILE, __LINE__, _name.getChars(), thrown);
}

/// What the last run threw, where nobody will join it any more.
void MtThread::traceThrown() noexcept {
    std::exception_ptr thrown;
    {
        const LkGuard endGuard(_endLock);
        thrown = std::exchange(_thrown, nullptr);
    }
    if (!thrown) return;
    try {
        std::rethrow_exception(thrown);
    } catch (...) {
        Assertions::traceCurrentException("running a thread that nobody joined");
    }
}

void MtThread::requestStop() {
    if (_protocol) {
        _protocol->performStop(this);
    } else {
        requestCancel(false);
    }
}

bool MtThread::canStart() noexcept {
    return isStartAllowed.load(std::memory_order_acquire) && !MtThreadNative::isProcessEnding();
}

void MtThread::allowStart(bool isAllowed) noexcept {
    isStartAllowed.store(isAllowed, std::memory_order_release);
}

// Running: the thread's side

void MtThread::execute(void* data) {
    ORV_ASSERT_TEXT(data != nullptr, "data");
    Frame frame{static_cast<MtThread*>(data)};
    if (frame.thread->enter(frame)) runBody(frame);
}

/// Prepares the thread for its body, under the lock, which the starter holds.
/// @return false if the starter was told of an error; the object may be gone then.
bool MtThread::enter(Frame& frame) noexcept {
    try {
        _native->enter();
        _isCancelRequested.store(false, std::memory_order_relaxed);
        Frame::current.set(&frame);
        _dataNumber = MtSpecificDataRegistry::getThreadNumber();
        LgRegistry::getInstance().registerThread(_name.getText());
        _native->setName(_name.getChars());
        _isLevelRefused = !_native->applyLevel(_level, MtThreadMgr::get().isRealTime());
        placeAtStart();
        _isRunning.store(true, std::memory_order_release);
    } catch (...) {
        _startError = std::current_exception();
    }
    const bool hasEntered = !_startError;
    _started.post();
    return hasEntered;
}

void MtThread::runBody(Frame& frame) {
    try {
        frame.attempt([&] {
            if (MtThreadProtocol* const protocol = frame.thread->_protocol.get()) {
                protocol->performBody(frame.thread);
            }
        });
    } catch (...) {  // the C library unwinds the thread
        finish(frame);
        throw;
    }
    finish(frame);
}

void MtThread::finish(Frame& frame) {
    frame.attempt([&] {
        if (frame.thread != nullptr && frame.thread->_protocol) {
            frame.thread->_protocol->performFinished(frame.thread);
        }
    });
    frame.attempt(freeSpecificData);
    if (frame.thread != nullptr) {
        frame.thread->end(frame.thrown);
    } else if (frame.thrown) {
        ORV_TRACE(TraceLevel::getMain())
            << "A thread whose object had gone ended with an exception: "
            << MtEx::describe(frame.thrown);
    }
}

/// The last that the thread does with its object.
void MtThread::end(const std::exception_ptr& thrown) {
    if (thrown && _terminatesOnUnhandled) {
        ORV_TRACE(TraceLevel::getMain()) << "Terminating on unhandled exception. Thread \"" << _name
                                         << "\": " << MtEx::describe(thrown);
        TraceManager::getInstance().flush();
        std::abort();
    }
    const LkGuard endGuard(_endLock);
    _thrown = thrown;
    _hasEnded = true;
    _native->leave();
}

void MtThread::freeSpecificData() {
    MtSpecificDataRegistry::getInstance().removeSpecificData();
}

MtThread* MtThread::findCurrent() noexcept {
    const Frame* const frame = Frame::find();
    return frame != nullptr ? frame->thread : nullptr;
}

bool MtThread::isCurrentThread() const noexcept {
    return findCurrent() == this;
}

// Cancellation

bool MtThread::requestCancel(bool check) {
    ORV_ASSERT(!check || isRunningNoLock());
    if (_isCancelRequested.exchange(true, std::memory_order_acq_rel)) return false;
    if (_protocol) _protocol->performCanceled(this);
    return true;
}

bool MtThread::clearCancel() noexcept {
    return _isCancelRequested.exchange(false, std::memory_order_acq_rel);
}

bool MtThread::isCancelRequested() const {
    ORV_ASSERT(isRunning());
    return _isCancelRequested.load(std::memory_order_acquire);
}

void MtThread::setCancelable(bool isCancelable) {
    const LkGuard guard(_lock);
    _isCancelable = isCancelable;
}

bool MtThread::isCancelable() const {
    const LkGuard guard(_lock);
    return _isCancelable;
}

bool MtThread::forceStop() {
    {
        const LkGuard guard(_lock);
        if (!_isCancelable) {
            Assertions::throwProgramAborted(ORV_FILE, __LINE__, "_cancelable is FALSE!!!");
        }
        ORV_ASSERT(isRunningNoLock());
        ORV_ASSERT(!_isMainThread);
        ORV_ASSERT(!isCurrentThread());
    }
    const LkTimeLimit limit(LONGEST_FORCED_STOP_SECONDS);
    bool isStopped = false;
    while (!(isStopped = tryForceStop()) && limit.getRemainingMilliseconds() > 0) MtUtil::yield();
    if (_protocol) _protocol->performCanceled(this);
    return isStopped;
}

/// Ends the thread at a moment when it holds none of the locks that every thread of the process
/// needs now and then, nor is on its way out, where the system holds some. While it is suspended it
/// may hold any lock of the C library: nothing is allocated.
bool MtThread::tryForceStop() {
    const LkRecLock& listLock = MtThreadMgr::get().imp().getThreads().getLock();
    const LkRecLock& dataLock = MtSpecificDataRegistry::getInstance().getLock();
    bool isStopped = false;
    _native->suspend();
    if (!listLock.isLocked() && !_lock.isLocked() && !_endLock.isLocked() && !dataLock.isLocked()) {
        const LkGuard listGuard(listLock);
        const LkGuard guard(_lock);
        const LkGuard endGuard(_endLock);
        const LkGuard dataGuard(dataLock);
        if (!_hasEnded && !_isForced) _isForced = _native->terminate();
        isStopped = _hasEnded || _isForced;
    }
    _native->resume();
    return isStopped;
}

// Queries

LkThreadId MtThread::getThreadId() const {
    const LkGuard guard(_lock);
    return isRunningNoLock() ? _native->getId() : LkThreadId();
}

void MtThread::dump(std::ostream& stream) const {
    const LkGuard guard(_lock);
    const LkGuard endGuard(_endLock);
    stream << _name << " prio " << getPriorityLevel() << " NTprio " << getBasePriority()
           << " pol RR SYSTEM ex? " << (_thrown ? MtEx::describe(_thrown) : "no exception")
           << " runon " << _processorNb << '\n';
}

}  // namespace Orv
