#include "lkMutex.h"

#include <ostream>

#include "assertions.h"
#include "lkNative.h"

namespace Orv {

// No platform has attributes that make a difference, so a mutex without any asks for no default:
// it can be made before the packages are up and after they are down.
LkMutex::LkMutex(const char* name) : _native(name) {}

LkMutex::LkMutex(const char* name, const LkMutexAttr&) : _native(name) {}

LkMutex::~LkMutex() noexcept(false) {
    const bool _isLocked = isLocked();
    ORV_ASSERT_IN_DESTRUCTOR(!_isLocked);
}

bool LkMutex::lock() const {
    return _native->lock();
}

bool LkMutex::spinLock(unsigned tries) const {
    return _native->spinLock(tries);
}

bool LkMutex::tryLock() const {
    return _native->tryLock();
}

void LkMutex::unlock() const {
    _native->unlock();
}

bool LkMutex::isLocked() const noexcept {
    return _native->isLocked();
}

bool LkMutex::isLockedByThread() const noexcept {
    return _native->isLockedByThread();
}

const char* LkMutex::getName() const noexcept {
    return _native->getName();
}

void LkMutex::dump(std::ostream& stream) const {
    _native->dump(stream);
}

LkMutex::Native& LkMutex::getImp() const noexcept {
    return *_native;
}

}  // namespace Orv
