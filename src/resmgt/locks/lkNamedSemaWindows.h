#pragma once

#include "lkSemaTypes.h"

namespace Orv {

/// Named semaphore over a semaphore object of the system.
class LkNamedSemaWindows {
public:
    LkNamedSemaWindows(const char* osName, unsigned initialCount,
                       LkSemaTypes::CreateFlag createFlag);
    ~LkNamedSemaWindows() { close(); }
    LkNamedSemaWindows(const LkNamedSemaWindows&) = delete;
    LkNamedSemaWindows& operator=(const LkNamedSemaWindows&) = delete;

    void post();
    void wait();
    bool tryWait();

    int getErrno() const noexcept { return _errno; }
    int close() noexcept;  ///< Once; later calls do nothing. @return the system's error, or 0.

private:
    void* _sema;  // null if there is none
    int _errno;
};

}  // namespace Orv
