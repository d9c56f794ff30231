#include "lkLock.h"

#include "lkNative.h"

namespace Orv {

LkLock::LkLock(const char* name) : _native(name) {}

LkLock::~LkLock() = default;

bool LkLock::lock() const {
    return _native->lock();
}

void LkLock::unlock() const {
    _native->unlock();
}

bool LkLock::isLocked() const noexcept {
    return _native->isLocked();
}

bool LkLock::isLockedByThread() const noexcept {
    return _native->isLockedByThread();
}

const char* LkLock::getName() const noexcept {
    return _native->getName();
}

void LkLock::dump(std::ostream& stream) const {
    _native->dump(stream);
}

}  // namespace Orv
