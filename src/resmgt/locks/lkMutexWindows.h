#pragma once

#include <atomic>
#include <iosfwd>
#include <windows.h>

namespace Orv {

/// LkMutex over an unnamed Win32 mutex.
class LkMutexWindows {
public:
    explicit LkMutexWindows(const char* name);
    ~LkMutexWindows();
    LkMutexWindows(const LkMutexWindows&) = delete;
    LkMutexWindows& operator=(const LkMutexWindows&) = delete;

    /// @throws SysAssertionFailed if the owner has ended; the mutex is free then.
    bool lock();

    /// @throws LkEx::ExDeadLock if the caller holds the mutex; what lock() throws.
    bool spinLock(unsigned tries);

    bool tryLock();  ///< False also for the owner.

    /// @throws SysAssertionFailed if the caller does not hold the mutex.
    void unlock();

    // For waits, which release the mutex once and must hold it again in the end, whoever has ended
    // holding it: clear the flag, release the handle, and after the wait relock().
    HANDLE getMutex() const noexcept { return _mutex; }
    void clearLockedFlag() noexcept;
    void updateLockingThreadId() noexcept;
    void relock();

    bool isHeldOnceByCaller() const noexcept;
    bool isLocked() const noexcept { return _depth.load(std::memory_order_relaxed) != 0; }
    bool isLockedByThread() const noexcept { return isLocked(); }
    const char* getName() const noexcept { return _name; }
    void dump(std::ostream&) const;

private:
    const char* _name;
    HANDLE _mutex;
    // Written by the owner alone; the handle is what excludes.
    std::atomic<DWORD> _owner{0};
    std::atomic<int> _depth{0};
    bool _isAbandoned = false;  // found by tryLock(), kept for the next lock(); under the mutex

    void release();
    void enter() noexcept;
    bool isHeldByCaller() const noexcept;
    [[noreturn]] void failAbandoned();
};

}  // namespace Orv
