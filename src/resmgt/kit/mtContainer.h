#pragma once

#include <atomic>
#include <chrono>
#include <cstdint>
#include <limits>
#include <vector>

#include "devWaitGraph.h"
#include "lkAdaptiveWait.h"
#include "lkLock.h"
#include "lkMutex.h"
#include "lkPulse.h"
#include "lkTimeLimit.h"
#include "rcShdPtr.h"

namespace Orv {

template <class Entry>
class MtContainer;

/// Hears what goes in and out of a container. Called without its locks, on the thread that did it:
/// it may use the container, which others may have changed by then.
template <class Entry>
class ORV_HEADER_API MtContainerObserver : public RCBase<LkCounter<long>> {
public:
    virtual void destroyed(MtContainer<Entry>& container) = 0;
    /// @param entry  the producer's, which the container has emptied.
    virtual void produced(MtContainer<Entry>& container, Entry& entry) = 0;
    virtual void consumed(MtContainer<Entry>& container, Entry& entry) = 0;
};

/// First-in first-out queue that threads wait at: for entries, and for room. The engine of the
/// device and manager queues.
///
/// Producers fill one array while consumers empty another, and the two are exchanged when that is
/// empty; so the two sides seldom meet at a lock. Entries are moved, not copied.
///
/// - Threads: every member by any thread. Waits are adaptive; a thread wakes only for its own sake.
/// - Circles: the thread that empties the queue makes itself known with DevWaitGraph::Serving. A
///   wait for room that would close a circle of such threads goes past the capacity instead.
/// - Destroying one that holds entries, as close() leaves none, is an assertion.
template <class Entry>
class MtContainer : private DevWaitGraph::Breaker {
public:
    enum class Result {
        DONE,
        DONE_WAKING,  ///< Done, and a consumer woken for it that had slept for long.
        TIMED_OUT,
        CLOSED
    };
    /// A sleep longer than that says that requests come far apart.
    static constexpr std::chrono::microseconds LONG_SLEEP{50};

    enum Room { WAIT_FOR_ROOM, PAST_CAPACITY };

    /// @param name  of the mutex; borrowed, must outlive the container.
    /// @param capacity  in entries; 0 and less: as many as there is memory for.
    MtContainer(const char* name, std::int64_t capacity);
    ~MtContainer() noexcept(false);

    MtContainer(const MtContainer&) = delete;
    MtContainer& operator=(const MtContainer&) = delete;

    /// Asserts that there is none yet.
    void setObserver(RCShdPtr<MtContainerObserver<Entry>> observer);

    /// Appends the entry, with a result of DONE or DONE_WAKING; else the caller still has it.
    Result produce(Entry& entry, Room room = WAIT_FOR_ROOM, const LkTimeLimit& limit = {});

    /// Takes the first entry, waiting for one; CLOSED when none can come any more.
    Result consume(Entry& entry);
    bool tryConsume(Entry& entry);  ///< False, and @p entry untouched, if there is none.

    /// Lets nothing more in, ends all waits, and destroys what is inside, in order and without a
    /// lock. Afterwards the container holds no entry for good.
    void close();

    bool isClosed() const noexcept { return _isClosed.load(std::memory_order_acquire); }
    std::size_t getSize() const noexcept { return _nbIn.load() + _nbOut.load(); }  ///< A snapshot.
    bool hasRoom() const noexcept { return getSize() < _capacity; }                ///< A snapshot.

    /// For DevWaitGraph: who empties this container.
    DevWaitGraph::Target& getTarget() noexcept { return _target; }

private:
    /// Threads that sleep at a pulse, and how many of them have one on its way; never more pulses
    /// than threads.
    class Sleepers {
    public:
        bool isEmpty() const noexcept { return _counts.load() == 0; }
        void enter() noexcept { _counts.fetch_add(ONE_WAITING); }
        void leavePulsed() noexcept { _counts.fetch_sub(ONE_WAITING + 1); }

        /// @return false if all have a pulse on its way, so that one of them is the caller's.
        bool leaveUnpulsed() noexcept;

        bool wakeOne() noexcept;  ///< Whether to pulse.
        int wakeAll() noexcept;   ///< How often to pulse.

    private:
        static constexpr std::uint64_t ONE_WAITING = std::uint64_t{1} << 32;
        std::atomic<std::uint64_t> _counts{0};  // those that wait in the upper half

        static bool areAllPulsed(std::uint64_t counts) noexcept {
            return counts / ONE_WAITING == counts % ONE_WAITING;
        }
    };

    // The consumers' side
    LkLock _outLock;
    std::vector<Entry> _out ORV_GUARDED_BY(_outLock);
    std::size_t _nextOut ORV_GUARDED_BY(_outLock) = 0;
    std::atomic<std::size_t> _nbOut{0};  // written under _outLock
    LkAdaptiveWait _entryLook;
    alignas(64) std::atomic<std::uint32_t> _nbArrivals{
        0};  // told when the producer has left _mutex

    // The producers' side; _outLock is taken before _mutex.
    alignas(64) LkMutex _mutex;
    std::vector<Entry> _in ORV_GUARDED_BY(_mutex);
    std::atomic<std::size_t> _nbIn{0};  // written under _mutex
    std::atomic<bool> _isClosed{false};
    std::atomic<bool> _isObserved{false};
    const std::size_t _capacity;
    LkAdaptiveWait _roomLook;
    Sleepers _consumers, _producers;
    LkTimeLimit::Clock::time_point _asleepSince ORV_GUARDED_BY(_mutex);  // the last consumer
    LkPulse _nonEmpty, _nonFull;
    RCShdPtr<MtContainerObserver<Entry>> _observer;
    DevWaitGraph::Target _target;

    bool takeOut(Entry& entry) ORV_REQUIRES(_outLock);
    bool refill() ORV_REQUIRES(_outLock);
    void waitForEntry(std::uint32_t nbArrivalsSeen);
    bool waitForRoom(const LkTimeLimit& limit);
    void letGo() override;
    void sleep(const LkGuard<const LkMutex>& guard, Sleepers& sleepers, LkPulse& pulse,
               const LkTimeLimit& limit);
};

}  // namespace Orv

#include "mtContainer.imp"
