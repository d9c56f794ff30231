#pragma once

#include <atomic>
#include <cstdint>

#include "lkWaitNative.h"

namespace Orv {

/// A thread's place in an LkWaitQueue; a thread stands in one queue at a time.
///
/// Waiters live in a pool that is never given back to the system. So a wake-up that is late finds
/// its waiter's memory whatever that thread does by now, and the place of a thread that was ended
/// by force in its wait is merely lost.
class LkWaiter {
public:
    /// The calling thread's waiter, for the time of one wait.
    class Use;

    /// Before the waiter is put into a queue.
    void prepare() noexcept { _state.store(WAITING, std::memory_order_relaxed); }

    bool isReleased() const noexcept { return _state.load(std::memory_order_acquire) == RELEASED; }

    /// @return false if the time ran out before the release.
    bool sleepUntilReleased(const LkTimeLimit& limit);

    /// Lets the thread go. It is out of the queue by now, and what it waited at may be gone.
    void release() noexcept {
        if (_state.exchange(RELEASED, std::memory_order_acq_rel) == ASLEEP) _parker.wake(_state);
    }

private:
    friend class LkWaitQueue;
    friend class LkWaiterPool;

    enum State : std::uint32_t { WAITING, ASLEEP, RELEASED };

    alignas(64) std::atomic<std::uint32_t> _state{WAITING};  // looked at: a cache line of its own
    alignas(64) LkParker _parker;

    // For the queue, under its lock; _next for the pool while nobody waits.
    LkWaiter* _next = nullptr;
    LkWaiter* _previous = nullptr;
    bool _isQueued = false;
};

class LkWaiter::Use {
public:
    Use();
    ~Use();
    Use(const Use&) = delete;
    Use& operator=(const Use&) = delete;

    LkWaiter& operator*() const noexcept { return *_waiter; }

private:
    LkWaiter* _waiter;
    bool _isBorrowed = false;
};

}  // namespace Orv
