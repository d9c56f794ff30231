#pragma once

#include <atomic>
#include <cstdint>
#include <iosfwd>

#include "lkAdaptiveWait.h"
#include "lkGuard.h"
#include "lkMutex.h"
#include "lkPulse.h"

namespace Orv {

class LkMutexAttr;

/// Many readers or one writer. Writers come first: while one waits, new readers wait as well.
///
/// LkReadGuard and LkWriteGuard take and release it. A reader must not lock for reading again while
/// it reads: a writer in between would block both for ever. For short sections, or where writes are
/// frequent, LkLock is faster.
///
/// - Threads: every member by any thread; a lock is released by the thread that took it. It may be
///   destroyed as soon as the last who wanted it has it and has released it.
/// - Cost: taking and releasing it while nobody has to wait is one atomic operation each.
class ORV_RESMGT_API ORV_CAPABILITY("mutex") LkRwLock {
public:
    /// @param name  shown by dump(); borrowed, must outlive the lock.
    explicit LkRwLock(const char* name);
    LkRwLock(const char* name, const LkMutexAttr&);

    LkRwLock(const LkRwLock&) = delete;
    LkRwLock& operator=(const LkRwLock&) = delete;

    bool isLocked() const noexcept;  ///< By any reader or writer; a snapshot.
    bool isLockedByThread() const noexcept { return isLocked(); }  ///< Does not tell by which.

    const char* getName() const noexcept { return _mutex.getName(); }
    void dump(std::ostream& stream) const;

private:
    template <class T>
    friend class LkGuard;

    // Holders and flags in one word, so that nobody needs the mutex unless somebody waits. The
    // flags are raised with the mutex held; while one is up, the lock becomes free with the mutex
    // held.
    static constexpr std::uint32_t FREE = 0;
    static constexpr std::uint32_t READER = 1;
    static constexpr std::uint32_t READERS = (1U << 29) - 1;
    static constexpr std::uint32_t WRITER = 1U << 29;
    static constexpr std::uint32_t HOLDERS = READERS | WRITER;
    static constexpr std::uint32_t WRITERS_WAIT = 1U << 30;
    static constexpr std::uint32_t READERS_WAIT = 1U << 31;

    mutable std::atomic<std::uint32_t> _word{0};
    mutable LkAdaptiveWait _readersWait;
    mutable LkAdaptiveWait _writersWait;
    LkMutex _mutex;
    mutable LkPulse _readersPulse;
    mutable LkPulse _writersPulse;
    mutable std::uint32_t _nbWaitingReaders ORV_GUARDED_BY(_mutex) = 0;
    mutable std::uint32_t _nbWaitingWriters ORV_GUARDED_BY(_mutex) = 0;
    mutable bool _isWriterWoken ORV_GUARDED_BY(_mutex) = false;  // pulsed, and not back yet

    bool lock() const ORV_ACQUIRE_SHARED() { return readLock(); }
    bool lock() ORV_ACQUIRE() { return writeLock(); }
    bool tryLock() const { return tryReadLock(); }
    bool tryLock() { return tryWriteLock(); }
    bool spinLock(unsigned tries) const { return spinReadLock(tries); }
    bool spinLock(unsigned tries) { return spinWriteLock(tries); }

    bool readLock() const;
    bool writeLock();
    bool tryReadLock() const noexcept;
    bool tryWriteLock() noexcept;
    bool spinReadLock(unsigned tries) const;
    bool spinWriteLock(unsigned tries);
    void unlock() const;

    void waitToRead() const;
    void waitToWrite();
    void release(std::uint32_t holder) const;
    void releaseForWaiters(std::uint32_t holder) const;
    void wakeNext() const ORV_REQUIRES(_mutex);
};

using LkReadGuard = LkGuard<const LkRwLock>;  ///< Holds an LkRwLock with other readers.
using LkWriteGuard = LkGuard<LkRwLock>;       ///< Holds an LkRwLock alone.

}  // namespace Orv
