#include "lkWaiterSlotPosix.h"

#include <pthread.h>

#include "assertions.h"

namespace Orv {

namespace {

constinit thread_local LkWaiter* ownWaiter = nullptr;  // read faster than the key's value
constinit thread_local bool hasEnded = false;
constinit LkWaiterSlotPosix::GiveBack giveBackWaiter = nullptr;  // set before any key's value

void noticeEnd(void*) {
    hasEnded = true;
    LkWaiter* const waiter = ownWaiter;
    ownWaiter = nullptr;
    giveBackWaiter(*waiter);
}

/// The key, whose value's destructor runs after those of the thread's own objects.
pthread_key_t getKey(LkWaiterSlotPosix::GiveBack giveBack) {
    static const pthread_key_t key = [giveBack] {
        giveBackWaiter = giveBack;
        pthread_key_t made;
        const int error = ::pthread_key_create(&made, noticeEnd);
        ORV_ASSERT_SYS(error == 0, "::pthread_key_create( &_key, noticeEnd )", error);
        return made;
    }();
    return key;
}

}  // namespace

LkWaiter* LkWaiterSlotPosix::get() noexcept {
    return ownWaiter;
}

bool LkWaiterSlotPosix::set(LkWaiter& waiter, GiveBack giveBack) {
    if (hasEnded) return false;
    const int error = ::pthread_setspecific(getKey(giveBack), &waiter);
    ORV_ASSERT_SYS(error == 0, "::pthread_setspecific( _key, waiter )", error);
    ownWaiter = &waiter;
    return true;
}

}  // namespace Orv
