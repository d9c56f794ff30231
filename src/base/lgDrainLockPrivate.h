#pragma once

#include <atomic>
#include <chrono>
#include <cstdint>
#include <thread>

#include "lgNative.h"
#include "threadSafety.h"

namespace Orv {

/// Lets one thread at a time empty the queues. Threads that log only ever try it, and leave it to
/// those that wait.
///
/// Taking and releasing stand in one total order with the other sequentially consistent operations,
/// which a mutex whose attempt fails does not promise: who fails here after announcing work may
/// rely on the holder, or the waiter, seeing the announcement after its release.
class ORV_CAPABILITY("mutex") LgDrainLock {
public:
    bool tryLock() noexcept ORV_TRY_ACQUIRE(true) {
        return _nbWaiting.load(std::memory_order_seq_cst) == 0 && take();
    }

    /// For the rare callers that have time: looks again every millisecond.
    bool lockWithin(std::chrono::milliseconds limit) noexcept ORV_TRY_ACQUIRE(true);

    void lock() noexcept ORV_ACQUIRE() {
        while (!lockWithin(std::chrono::hours(1))) {
        }
    }

    void unlock() noexcept ORV_RELEASE() { _holder.store(0, std::memory_order_seq_cst); }

    bool isHeldByCaller() const noexcept {
        return _holder.load(std::memory_order_relaxed) == LgSystem::getThreadToken();
    }

private:
    bool take() noexcept {
        std::uint64_t nobody = 0;
        return _holder.compare_exchange_strong(nobody, LgSystem::getThreadToken(),
                                               std::memory_order_seq_cst);
    }

    std::atomic<std::uint64_t> _holder{0};  // the thread's token
    std::atomic<int> _nbWaiting{0};
};

inline bool LgDrainLock::lockWithin(std::chrono::milliseconds limit) noexcept {
    const auto end = std::chrono::steady_clock::now() + limit;
    _nbWaiting.fetch_add(1, std::memory_order_seq_cst);
    bool isTaken = take();
    while (!isTaken && std::chrono::steady_clock::now() < end) {
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
        isTaken = take();
    }
    _nbWaiting.fetch_sub(1, std::memory_order_seq_cst);
    return isTaken;
}

}  // namespace Orv
