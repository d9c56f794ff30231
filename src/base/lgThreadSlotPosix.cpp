#include "lgThreadSlotPosix.h"

#include "assertions.h"

namespace Orv {

namespace {

char ended;
thread_local void* slot = nullptr;  // read faster than the key's value

}  // namespace

void* const LgThreadSlotPosix::ENDED = &ended;
void (*LgThreadSlotPosix::_threadEnds)(void*) = nullptr;

LgThreadSlotPosix::LgThreadSlotPosix(void (*threadEnds)(void* value)) {
    _threadEnds = threadEnds;
    const int error = ::pthread_key_create(&_key, notice);
    ORV_ASSERT_SYS(error == 0, "::pthread_key_create( &_key, notice )", error);
}

void LgThreadSlotPosix::notice(void* value) {
    slot = ENDED;
    _threadEnds(value);
}

void* LgThreadSlotPosix::get() const noexcept {
    return slot;
}

void LgThreadSlotPosix::set(void* value) {
    const int error = ::pthread_setspecific(_key, value);
    ORV_ASSERT_SYS(error == 0, "::pthread_setspecific( _key, value )", error);
    slot = value;
}

}  // namespace Orv
