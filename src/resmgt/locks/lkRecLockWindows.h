#pragma once

#include <iosfwd>

#include "lkCriticalSectionWindows.h"

namespace Orv {

/// LkRecLock over a critical section.
class LkRecLockWindows {
public:
    explicit LkRecLockWindows(const char* name) noexcept : _name(name) {}

    bool lock() noexcept;
    void unlock();

    bool isLocked() const noexcept { return _section.getDepth() != 0; }
    bool isLockedByThread() const noexcept { return _section.isHeldByCaller(); }
    const char* getName() const noexcept { return _name; }
    void dump(std::ostream&) const;

private:
    const char* _name;
    LkCriticalSectionWindows _section;
    std::atomic<DWORD> _holder{0};  // for dump(); none from the first unlock on
};

}  // namespace Orv
