#pragma once

#include <atomic>
#include <cstdint>

#include "lkAdaptiveWait.h"
#include "lkAddressWaitPosix.h"
#include "lkThreadIdPosix.h"

namespace Orv {

/// The lock under all locks of this platform: one word that holds the owner's thread id, and a bit
/// that says that threads may sleep on it. Its owner may take it again.
///
/// Free, it is taken with one compare-and-swap and released with one exchange. A thread that finds
/// it taken looks for a short while, where that has paid off lately, and then sleeps in the kernel.
/// Who comes first may be served last: a thread that is awake overtakes those that sleep.
///
/// - Memory: what was written before an unlock() is visible after the next lock().
/// - A waiter may destroy it as soon as its lock() returns, even while unlock() has not.
class LkFutexPosix {
public:
    /// Whether a waiter looks once a second for an owner that ended without unlocking.
    enum Watch { WATCH_OWNER, TRUST_OWNER };

    LkFutexPosix() noexcept = default;
    LkFutexPosix(const LkFutexPosix&) = delete;
    LkFutexPosix& operator=(const LkFutexPosix&) = delete;

    /// Holds the lock afterwards, in any case.
    /// @return false if it was taken over from a thread that has ended.
    [[nodiscard]] bool lock(Watch watch) {
        const std::uint32_t self = LkThreadIdPosix::getCurrent();
        return take(self) || lockSlowly(self, watch);
    }

    /// Never blocks, and does not re-enter.
    [[nodiscard]] bool tryLock() noexcept { return take(LkThreadIdPosix::getCurrent()); }

    /// @return false, having done nothing, if the caller does not hold the lock.
    [[nodiscard]] bool unlock() noexcept {
        if (!isHeldByCaller()) return false;
        if (const int nbReentries = _nbReentries.load(std::memory_order_relaxed)) {
            _nbReentries.store(nbReentries - 1, std::memory_order_relaxed);
            return true;
        }
        // Once the word is 0 the object may be gone: what is left to use is its address.
        if (_word.exchange(0, std::memory_order_release) & SLEEPERS) {
            LkAddressWaitPosix::wakeOne(&_word);
        }
        return true;
    }

    bool isHeld() const noexcept { return getOwner() != 0; }
    bool isHeldByCaller() const noexcept { return getOwner() == LkThreadIdPosix::getCurrent(); }

    /// The owner's thread id; 0 if there is none.
    std::uint32_t getOwner() const noexcept {
        return _word.load(std::memory_order_relaxed) & ~SLEEPERS;
    }

    /// How many unlocks the owner still owes; a snapshot when read by another thread.
    int getDepth() const noexcept {
        return isHeld() ? 1 + _nbReentries.load(std::memory_order_relaxed) : 0;
    }

private:
    static constexpr std::uint32_t SLEEPERS = 0x80000000;  // thread ids stay far below

    std::atomic<std::uint32_t> _word{0};
    std::atomic<int> _nbReentries{0};  // written by the owner
    LkAdaptiveWait _adaptiveWait;

    bool take(std::uint32_t self) noexcept {
        std::uint32_t free = 0;
        return _word.compare_exchange_strong(free, self, std::memory_order_acquire,
                                             std::memory_order_relaxed);
    }

    bool lockSlowly(std::uint32_t self, Watch watch);
    bool takeByLooking(std::uint32_t self) noexcept;
    bool takeBySleeping(std::uint32_t self, Watch watch);
};

}  // namespace Orv
