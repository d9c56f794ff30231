#include "mtOpaqueDataPosix.h"

#include "assertions.h"

namespace Orv {

MtOpaqueDataPosix::MtOpaqueDataPosix() {
    const int error = ::pthread_key_create(&_key, nullptr);
    ORV_ASSERT_SYS(error == 0, "::pthread_key_create( &_key, nullptr ) == 0", error);
}

MtOpaqueDataPosix::~MtOpaqueDataPosix() {
    ::pthread_key_delete(_key);
}

void MtOpaqueDataPosix::setValue(void* value) {
    const int error = ::pthread_setspecific(_key, value);
    ORV_ASSERT_SYS(error == 0, "::pthread_setspecific( _key, value ) == 0", error);
}

}  // namespace Orv
