#pragma once

#include <atomic>
#include <cstdint>

#include "lkAdaptiveWait.h"
#include "lkMutex.h"
#include "lkTimeLimit.h"
#include "resmgtApi.h"

namespace Orv {

class LkWaiter;

/// What semaphores, events, pulses and condition variables are made of: threads that wait in the
/// order they came, and releases that found nobody waiting, if the queue remembers those.
///
/// A release reaches threads that were waiting when it was given and never one that came later;
/// one that meets a time-out either ends that wait successfully or goes to the next thread.
///
/// - Threads: every member by any thread. A released thread may destroy the queue at once: releases
///   touch nothing of it after the thread can proceed.
/// - Memory: what was written before a release is visible to the thread that it releases.
/// - Cost: 32 bytes, no object of the system; a release that finds nobody waiting is one atomic
///   operation, and so is a wait that finds a remembered one.
class ORV_RESMGT_API LkWaitQueue {
public:
    /// What becomes of a release that finds nobody waiting.
    enum class Memory : std::uint8_t {
        FORGETS,  ///< Nothing.
        COUNTS,   ///< It lets one later wait pass.
        LASTS     ///< It lets every later wait pass until reset(). Releases reach all threads.
    };

    static constexpr std::uint32_t HIGHEST_COUNT = 0x7FFFFFFF;

    explicit LkWaitQueue(Memory memory, std::uint32_t nbReleases = 0) noexcept;
    LkWaitQueue(const LkWaitQueue&) = delete;
    LkWaitQueue& operator=(const LkWaitQueue&) = delete;

    /// Releases the first thread, all threads if releases last.
    /// @return false, and nothing is done, if HIGHEST_COUNT releases are remembered already.
    bool release() noexcept;
    void releaseAll() noexcept;  ///< Every thread that waits; remembers nothing. For FORGETS.
    void reset() noexcept;       ///< Forgets releases. Threads released already still pass.

    /// Whether a wait may look for its release before it sleeps.
    enum class Look : std::uint8_t { ADAPTIVE, NONE };

    /// Waits without looking at a mutex.
    /// @return false if the time ran out.
    bool wait(const LkTimeLimit& limit, Look look = Look::ADAPTIVE);
    bool tryWait() noexcept;  ///< Takes, or sees, a remembered release.

    /// Joins the queue, releases @p externalMutex for the time of the wait and holds it again on
    /// return, in every outcome. A wait that need not sleep gives others the mutex for a moment,
    /// too.
    bool wait(const LkMutex& externalMutex, const LkTimeLimit& limit);

    std::uint32_t getNbReleases() const noexcept;  ///< Remembered ones; a snapshot.
    std::uint32_t getNbWaiters() const noexcept;   ///< For diagnostics: walks along the queue.

private:
    // One word, so that giving up the lock and telling the news are the same moment:
    // remembered releases in the upper half, in the lower half three flags.
    using Word = std::uint64_t;
    static constexpr Word LOCKED = 1;     // the list is being changed
    static constexpr Word CONTENDED = 2;  // somebody sleeps until LOCKED goes
    static constexpr Word WAITERS = 4;    // the list is not empty
    static constexpr Word ONE_RELEASE = Word{1} << 32;
    static constexpr Word RELEASES = ~Word{0} << 32;

    mutable std::atomic<Word> _word;
    LkWaiter* _first = nullptr;  // guarded by LOCKED, as is all of the list
    LkWaiter* _last = nullptr;
    LkAdaptiveWait _adaptive;
    const Memory _memory;

    Word lock() const noexcept;
    void lockContended() const noexcept;
    void unlock(Word releases) const noexcept;
    static bool giveWay(LkMutex::Native& mutex, bool result);
    bool enter(LkWaiter& waiter) noexcept;
    bool await(LkWaiter& waiter, const LkTimeLimit& limit, Look look);
    bool leave(LkWaiter& waiter) noexcept;
    void unlink(LkWaiter& waiter) noexcept;
    LkWaiter* detachAll() noexcept;
    static void releaseList(LkWaiter* first) noexcept;
};

}  // namespace Orv
