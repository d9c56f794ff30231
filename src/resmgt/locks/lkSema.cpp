#include "lkSema.h"

#include "assertions.h"

namespace Orv {

LkSema::LkSema(const char* name, unsigned initialCount)
    : _queue(LkWaitQueue::Memory::COUNTS, initialCount), _name(name) {
    ORV_ASSERT(initialCount <= LkWaitQueue::HIGHEST_COUNT);
}

LkSema::LkSema(const char* name, unsigned initialCount, const LkMutexAttr&, const LkCondVarAttr&)
    : LkSema(name, initialCount) {}

void LkSema::post() {
    const bool hasRoom = _queue.release();  // a waiter may have destroyed the semaphore by now
    ORV_ASSERT_TEXT(hasRoom, "count < 2147483647");
}

void LkSema::wait() {
    _queue.wait(LkTimeLimit());
}

bool LkSema::timedWait(double seconds) {
    return _queue.wait(LkTimeLimit(seconds));
}

bool LkSema::tryWait() {
    return _queue.tryWait();
}

}  // namespace Orv
