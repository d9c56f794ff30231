#pragma once

#include <pthread.h>

namespace Orv {

/// One pointer per thread, over a key of the threads library. Its values are not owned.
class MtOpaqueDataPosix {
public:
    MtOpaqueDataPosix();
    ~MtOpaqueDataPosix();

    MtOpaqueDataPosix(const MtOpaqueDataPosix&) = delete;
    MtOpaqueDataPosix& operator=(const MtOpaqueDataPosix&) = delete;

    void* getValue() const noexcept { return ::pthread_getspecific(_key); }
    void setValue(void* value);
    bool isNull() const noexcept { return getValue() == nullptr; }

private:
    ::pthread_key_t _key;
};

}  // namespace Orv
