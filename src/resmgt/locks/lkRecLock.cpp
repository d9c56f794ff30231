#include "lkRecLock.h"

#include "lkNative.h"

namespace Orv {

LkRecLock::LkRecLock(const char* name) : _native(name) {}

// No platform has attributes that make a difference.
LkRecLock::LkRecLock(const char* name, const LkMutexAttr&) : _native(name) {}

LkRecLock::~LkRecLock() = default;

bool LkRecLock::lock() const {
    return _native->lock();
}

void LkRecLock::unlock() const {
    _native->unlock();
}

bool LkRecLock::isLocked() const noexcept {
    return _native->isLocked();
}

bool LkRecLock::isLockedByThread() const noexcept {
    return _native->isLockedByThread();
}

const char* LkRecLock::getName() const noexcept {
    return _native->getName();
}

void LkRecLock::dump(std::ostream& stream) const {
    _native->dump(stream);
}

}  // namespace Orv
