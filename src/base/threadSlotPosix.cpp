#include <pthread.h>

#include "assertions.h"
#include "threadSlot.h"

namespace Orv {

// The pointers stand in thread-local memory, which outlives all destructors of the thread; a key of
// the threads library has its end noticed.

struct ThreadSlot::Platform {
    static constinit thread_local Values values;
    static constinit thread_local Values* watched;  // null until the thread is

    static void notice(void* values) { tellAll(*static_cast<Values*>(values)); }

    static pthread_key_t makeKey() {
        pthread_key_t key;
        const int error = ::pthread_key_create(&key, notice);
        ORV_ASSERT_SYS(error == 0, "::pthread_key_create( &key, notice ) == 0", error);
        return key;
    }
};

constinit thread_local ThreadSlot::Values ThreadSlot::Platform::values{};
constinit thread_local ThreadSlot::Values* ThreadSlot::Platform::watched = nullptr;

ThreadSlot::Values* ThreadSlot::find() noexcept {
    return Platform::watched;
}

ThreadSlot::Values& ThreadSlot::watch() {
    static const pthread_key_t key = Platform::makeKey();
    const int error = ::pthread_setspecific(key, &Platform::values);
    ORV_ASSERT_SYS(error == 0, "::pthread_setspecific( key, &values ) == 0", error);
    return *(Platform::watched = &Platform::values);
}

}  // namespace Orv
