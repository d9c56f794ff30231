#pragma once

#include <iosfwd>

#include "lkCriticalSectionWindows.h"

namespace Orv {

/// LkLock over a critical section.
class LkLockWindows {
public:
    explicit LkLockWindows(const char* name) noexcept : _name(name) {}

    bool lock() noexcept {
        _section.enter();
        return true;
    }
    void unlock() { _section.leave(); }

    bool isLocked() const noexcept { return _section.getDepth() != 0; }
    bool isLockedByThread() const noexcept { return isLocked(); }
    const char* getName() const noexcept { return _name; }
    void dump(std::ostream&) const;

private:
    const char* _name;
    LkCriticalSectionWindows _section;
};

}  // namespace Orv
