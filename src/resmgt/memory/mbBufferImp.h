#pragma once

#include <atomic>
#include <cstdint>
#include <exception>
#include <iosfwd>

#include "liString.h"
#include "lkGuard.h"
#include "lkMutex.h"
#include "lkPulse.h"
#include "lkThreadId.h"
#include "mbAlignment.h"
#include "mbAsyncHandle.h"
#include "mbBufferStatistics.h"
#include "mbEvent.h"
#include "mbManager.h"
#include "mbPoolEntry.h"
#include "mbProtocol.h"
#include "mbRegion.h"
#include "rcShdEngPtr.h"
#include "rcShdPtr.h"

namespace Orv {

class MbState;
class MbStateMachine;
enum class MbStateId : std::uint8_t;

/// Contents before the first lock: none yet (load() makes them), or saved ones (reload() does).
enum class MbInitialState { FREED, UNLOADED };

/// A buffer, as managers, strategies and the machine of its states see it; applications hold
/// MbBuffer and lock through guards. Whatever is done to it is an event, to which its state reacts:
/// it changes the state, waits for another one, or is refused. docs/memory.md has the picture.
///
/// - Threads: every member by any thread that holds the buffer through a counted pointer. Calls of
///   the protocol and waits for room run with the mutex released and their thread recorded: if that
///   thread has to wait for this buffer, it gets the assertion "! _transientStateOwner.isCurrentThread()".
/// - Ownership: counted; the last holder to go destroys it. An asynchronous operation holds it too.
/// - Errors: each event throws MbEx::ExIllegalTransition where the state refuses it, and what the
///   protocol and the manager throw, after which the state before stands again.
class ORV_RESMGT_API MbBufferImp {
public:
    /// @param size  bytes, more than 0 (else an assertion), as null manager or protocol are.
    MbBufferImp(const LiString& name, int size, const MbAlignment& alignment,
                RCShdPtr<MbManager> manager, RCShdPtr<MbProtocol> protocol,
                const MbStateMachine& machine, MbInitialState initialState);

    MbBufferImp(const MbBufferImp&) = delete;
    MbBufferImp& operator=(const MbBufferImp&) = delete;

    // Events

    void rdlock() { receive(MbEvent::RDLOCK); }      ///< Waits for writers, and for contents.
    void wrlock() { receive(MbEvent::WRLOCK); }      ///< Waits for all other locks.
    void wrdup() { receive(MbEvent::WRDUP); }        ///< One write lock more for a writer.
    void prefetch() { receive(MbEvent::PREFETCH); }  ///< Loads, or makes it the last one used.
    void asyncSync() { receive(MbEvent::ASYNC_SYNC); }
    void sync() { receive(MbEvent::SYNC); }
    void unlock() { receive(MbEvent::UNLOCK); }
    void unload() { receive(MbEvent::UNLOAD); }  ///< Nothing unless loaded and unlocked.
    void free() { receive(MbEvent::FREE); }
    void destroy() { receive(MbEvent::DESTROY); }
    void asyncOpSucceeded() { receive(MbEvent::ASYNC_OP_SUCCEEDED); }
    void asyncOpFailed() { receive(MbEvent::ASYNC_OP_FAILED); }

    // Queries; none waits for the protocol or for room

    const char* getName() const { return _name.getChars(); }
    const LiString& getNameString() const noexcept { return _name; }
    int getSize() const noexcept { return _size; }  ///< Bytes.
    const MbAlignment& getAlignment() const noexcept { return _alignment; }
    bool isLoaded() const noexcept;  ///< A snapshot, as all that follow.
    bool isLocked() const noexcept;
    const char* getStateName() const noexcept;    ///< Such as "RdLocked".
    std::uint32_t getNbWaiting() const noexcept;  ///< Threads waiting for another state.
    MbBufferStatistics getStatistics() const noexcept;
    void dump(std::ostream&) const;

    // For the manager, and for who holds a lock

    const MbRegion& getRegion() const noexcept { return _region; }
    void setRegion(const MbRegion& region) noexcept { _region = region; }
    MbPoolEntry& getPoolEntry() noexcept { return _poolEntry; }

    /// The buffer, held; null if its last holder is gone and it is about to be destroyed.
    RCShdEngPtr<MbBufferImp> tryHold() noexcept;

    bool isUniquelyHeld() const noexcept { return getReferenceCount() == 1; }

private:
    friend class RCBasePtr<MbBufferImp>;
    friend class MbAsyncHandle;
    friend class MbStateImp;
    using Guard = LkGuard<const LkMutex>;
    using Count = std::atomic<std::uint64_t>;  // written under _mutex, read anywhere

    ~MbBufferImp();

    const LiString _name;
    const int _size;
    const MbAlignment _alignment;
    const RCShdPtr<MbManager> _manager;
    const RCShdPtr<MbProtocol> _protocol;
    const MbStateMachine& _machine;
    mutable std::atomic<long> _nbReferences{0};

    LkMutex _mutex;
    LkPulse _pulse;  // wakes all who wait for another state
    // Guarded by _mutex:
    Guard* _guard = nullptr;  // of the thread that holds the mutex
    LkThreadId _transientStateOwner;
    std::uint32_t _lockCount = 0;
    std::uint32_t _pendingEvents = 0;
    bool _isReplaying = false;          // pending events are being delivered
    bool _isWritten = false;            // the lock that goes, or went last, was a write lock
    bool _isOperationUnderWay = false;  // an asynchronous one, not handled to its end
    bool _isOperationReported = false;
    RCShdPtr<MbAsyncHandle> _asyncHandle;  // of the latest operation
    std::atomic<const MbState*> _state;    // written under _mutex
    std::atomic<std::uint32_t> _nbWaiting{0};
    Count _nbHits{0}, _nbLoads{0}, _nbReloads{0}, _nbEvictions{0};

    MbRegion _region;  // the transition's, the manager's or the lock holders', in turn
    MbPoolEntry _poolEntry;

    void receive(MbEvent event);
    void deliver(MbEvent event);
    void asyncOpReported(const MbAsyncHandle& handle, MbEvent event);
    void waitForChange();
    void transition(MbStateId next);
    void follow(MbStateId next);
    void setState(const MbState& state) noexcept;
    void restore(const MbState& before) noexcept;
    void deliverPending(std::exception_ptr& failure) noexcept;

    // Counting, for the pointers
    void incReferenceCount() const noexcept {
        _nbReferences.fetch_add(1, std::memory_order_relaxed);
    }
    void decReferenceCount();
    long getReferenceCount() const noexcept {
        return _nbReferences.load(std::memory_order_acquire);
    }
};

}  // namespace Orv
