#include "lkMutexWindows.h"

#include <ostream>

#include "assertions.h"
#include "lkAdaptiveWait.h"
#include "lkEx.h"

namespace Orv {

namespace {

constexpr auto relaxed = std::memory_order_relaxed;

}  // namespace

LkMutexWindows::LkMutexWindows(const char* name)
    : _name(name), _mutex(::CreateMutexW(nullptr, FALSE, nullptr)) {
    ORV_ASSERT_SYS(_mutex != nullptr, "_mutex != NULL", static_cast<int>(::GetLastError()));
}

LkMutexWindows::~LkMutexWindows() {
    ::CloseHandle(_mutex);
}

bool LkMutexWindows::lock() {
    const DWORD result = ::WaitForSingleObject(_mutex, INFINITE);
    ORV_ASSERT_SYS(result == WAIT_OBJECT_0 || result == WAIT_ABANDONED,
                   "::WaitForSingleObject( _mutex, INFINITE ) == WAIT_OBJECT_0",
                   static_cast<int>(::GetLastError()));
    if (result == WAIT_ABANDONED || _isAbandoned) [[unlikely]]
        failAbandoned();
    enter();
    return true;
}

void LkMutexWindows::failAbandoned() {
    _isAbandoned = false;
    clearLockedFlag();
    release();
    Assertions::throwSysAssertionFailed(
        ORV_FILE, __LINE__, "::WaitForSingleObject( _mutex, INFINITE ) == WAIT_OBJECT_0",
        ERROR_ABANDONED_WAIT_0);
}

bool LkMutexWindows::spinLock(unsigned tries) {
    if (isHeldByCaller()) {
        throw LkEx::ExDeadLock(ORV_FILE, __LINE__, "LkMutexWindows", _name, 0, "self deadlock");
    }
    LkAdaptiveWait::Look look;
    do {  // 0 tries wrap around to very many
        if (!isLocked() && tryLock()) return true;
    } while (--tries != 0 && LkAdaptiveWait::mayLook() && look.goesOn());
    return lock();
}

bool LkMutexWindows::tryLock() {
    const DWORD result = ::WaitForSingleObject(_mutex, 0);
    if (result == WAIT_ABANDONED) _isAbandoned = true;
    if (result != WAIT_OBJECT_0 && result != WAIT_ABANDONED) return false;
    if (_isAbandoned || isLocked()) {  // locked: by the caller, who has now taken it twice
        release();
        return false;
    }
    enter();
    return true;
}

void LkMutexWindows::unlock() {
    if (isHeldByCaller()) {
        const int depth = _depth.load(relaxed) - 1;
        if (depth == 0) _owner.store(0, relaxed);
        _depth.store(depth, relaxed);
    }
    release();
}

void LkMutexWindows::release() {
    ORV_ASSERT_SYS(::ReleaseMutex(_mutex), "::ReleaseMutex( _mutex )",
                   static_cast<int>(::GetLastError()));
}

void LkMutexWindows::enter() noexcept {
    _depth.store(_depth.load(relaxed) + 1, relaxed);
    _owner.store(::GetCurrentThreadId(), relaxed);
}

void LkMutexWindows::clearLockedFlag() noexcept {
    _owner.store(0, relaxed);
    _depth.store(0, relaxed);
}

void LkMutexWindows::updateLockingThreadId() noexcept {
    _depth.store(1, relaxed);
    _owner.store(::GetCurrentThreadId(), relaxed);
}

void LkMutexWindows::relock() {
    const DWORD result = ::WaitForSingleObject(_mutex, INFINITE);
    ORV_ASSERT_SYS(result == WAIT_OBJECT_0 || result == WAIT_ABANDONED,
                   "::WaitForSingleObject( externalMutex.getImp().getMutex(), INFINITE ) == "
                   "WAIT_OBJECT_0",
                   static_cast<int>(::GetLastError()));
    _isAbandoned = false;
    updateLockingThreadId();
}

bool LkMutexWindows::isHeldByCaller() const noexcept {
    return _owner.load(relaxed) == ::GetCurrentThreadId();
}

bool LkMutexWindows::isHeldOnceByCaller() const noexcept {
    return isHeldByCaller() && _depth.load(relaxed) == 1;
}

void LkMutexWindows::dump(std::ostream& stream) const {
    stream << "LkMutex \"" << _name << "\" holder " << _owner.load(relaxed) << " count "
           << _depth.load(relaxed);
}

}  // namespace Orv
