#include "mtThreadEndPosix.h"

#include <pthread.h>

#include "assertions.h"
#include "mtSpecificDataRegistry.h"

namespace Orv {

namespace {

char watched;  // any address: what the key holds for a thread that is watched

void threadEnds(void*) {
    try {
        MtSpecificDataRegistry::getInstance().removeSpecificData();
    } catch (...) {
        Assertions::traceCurrentException("deleting the data of a thread that ends");
    }
}

::pthread_key_t createKey() {
    ::pthread_key_t key;
    const int error = ::pthread_key_create(&key, threadEnds);
    ORV_ASSERT_SYS(error == 0, "::pthread_key_create( &key, threadEnds ) == 0", error);
    return key;
}

}  // namespace

void MtThreadEndPosix::watchCallingThread() {
    static const ::pthread_key_t key = createKey();
    if (::pthread_getspecific(key) != nullptr) return;
    const int error = ::pthread_setspecific(key, &watched);
    ORV_ASSERT_SYS(error == 0, "::pthread_setspecific( key, &watched ) == 0", error);
}

}  // namespace Orv
