#pragma once

#include <pthread.h>

namespace Orv {

/// A pointer of each thread, whose end is noticed. One object per process.
class LgThreadSlotPosix {
public:
    /// What get() gives once the thread's end has been noticed, while the thread still runs.
    static void* const ENDED;

    /// @param threadEnds  called with the value on each thread that ends after set().
    explicit LgThreadSlotPosix(void (*threadEnds)(void* value));

    void* get() const noexcept;  ///< Null before set().
    void set(void* value);       ///< Once per thread. @throws SysAssertionFailed

private:
    static void notice(void* value);

    static void (*_threadEnds)(void*);
    ::pthread_key_t _key;
};

}  // namespace Orv
