#pragma once

#include <atomic>
#include <windows.h>

namespace Orv {

/// A critical section that knows its owner: the lock under LkLock and LkRecLock on Windows.
class LkCriticalSectionWindows {
public:
    LkCriticalSectionWindows() noexcept { ::InitializeCriticalSection(&_section); }
    ~LkCriticalSectionWindows() { ::DeleteCriticalSection(&_section); }
    LkCriticalSectionWindows(const LkCriticalSectionWindows&) = delete;
    LkCriticalSectionWindows& operator=(const LkCriticalSectionWindows&) = delete;

    void enter() noexcept;

    /// @throws AssertionFailed if the caller does not hold the section.
    void leave();

    /// How many times it was entered and not left; a snapshot when read by another thread.
    int getDepth() const noexcept { return _depth.load(std::memory_order_relaxed); }
    bool isHeldByCaller() const noexcept;

private:
    CRITICAL_SECTION _section;
    // Written by the owner alone; the section is what excludes.
    std::atomic<DWORD> _owner{0};
    std::atomic<int> _depth{0};
};

}  // namespace Orv
