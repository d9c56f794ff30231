#pragma once

#include <atomic>
#include <chrono>
#include <thread>

#include "threadSafety.h"

namespace Orv {

/// Lets one thread at a time empty the queues. Threads that log only ever try it.
///
/// Taking and releasing stand in one total order with the other sequentially consistent operations,
/// which a mutex whose attempt fails does not promise: who fails here after announcing work may
/// rely on the holder seeing the announcement after its release.
class ORV_CAPABILITY("mutex") LgDrainLock {
public:
    bool tryLock() noexcept ORV_TRY_ACQUIRE(true) {
        return !_isTaken.exchange(true, std::memory_order_seq_cst);
    }

    /// For the rare callers that have time: looks again every millisecond.
    bool lockWithin(std::chrono::milliseconds limit) noexcept ORV_TRY_ACQUIRE(true) {
        const auto end = std::chrono::steady_clock::now() + limit;
        while (!tryLock()) {
            if (std::chrono::steady_clock::now() >= end) return false;
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
        return true;
    }

    void lock() noexcept ORV_ACQUIRE() {
        while (!lockWithin(std::chrono::hours(1))) {
        }
    }

    void unlock() noexcept ORV_RELEASE() { _isTaken.store(false, std::memory_order_seq_cst); }

private:
    std::atomic<bool> _isTaken{false};
};

}  // namespace Orv
