#include "lkUnnamedSema.h"

#include "assertions.h"

namespace Orv {

LkUnnamedSema::LkUnnamedSema(const char* name, unsigned initialCount, LkSemaTypes::Shared) noexcept
    : _queue(LkWaitQueue::Memory::COUNTS,
             initialCount <= LkSemaTypes::HIGHEST_COUNT ? initialCount : 0),
      _name(name),
      _errno(initialCount <= LkSemaTypes::HIGHEST_COUNT ? 0 : LkSemaTypes::getCountError()) {}

void LkUnnamedSema::post() {
    ORV_ASSERT(isValid());
    const bool hasRoom = _queue.release();  // a waiter may have destroyed the semaphore by now
    ORV_ASSERT_TEXT(hasRoom, "count < 2147483647");
}

void LkUnnamedSema::wait() {
    ORV_ASSERT(isValid());
    _queue.wait(LkTimeLimit());
}

void LkUnnamedSema::waitAsleep() {
    ORV_ASSERT(isValid());
    _queue.wait(LkTimeLimit(), LkWaitQueue::Look::NONE);
}

bool LkUnnamedSema::tryWait() {
    ORV_ASSERT_TEXT(isValid(), "result == WAIT_TIMEOUT");
    return _queue.tryWait();
}

}  // namespace Orv
