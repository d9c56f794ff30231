#pragma once

#include <windows.h>

namespace Orv {

/// A mutex that all threads of the session find by its name.
class LkNamedMutexWindows {
public:
    /// Creates the mutex or opens the one there is. @throws ExSysErrorWindows
    explicit LkNamedMutexWindows(const char* name);
    ~LkNamedMutexWindows() noexcept(false);
    LkNamedMutexWindows(const LkNamedMutexWindows&) = delete;
    LkNamedMutexWindows& operator=(const LkNamedMutexWindows&) = delete;

    bool lock();    ///< Blocks until held. @throws ExSysErrorWindows, also if the holder has ended.
    void unlock();  ///< @throws ExSysErrorWindows

    static long getProcessId() noexcept { return static_cast<long>(::GetCurrentProcessId()); }

private:
    HANDLE _mutex;
};

}  // namespace Orv
