#pragma once

#include <memory>
#include <string>
#include <unistd.h>

namespace Orv {

class LkFutexPosix;

/// A mutex that all threads of the process find by its name; it goes with the last of them.
class LkNamedMutexPosix {
public:
    explicit LkNamedMutexPosix(const char* name);
    ~LkNamedMutexPosix();
    LkNamedMutexPosix(const LkNamedMutexPosix&) = delete;
    LkNamedMutexPosix& operator=(const LkNamedMutexPosix&) = delete;

    bool lock();    ///< Blocks until held. @throws ExSysErrorPosix if the holder has ended.
    void unlock();  ///< @throws ExSysErrorPosix

    static long getProcessId() noexcept { return ::getpid(); }

private:
    const std::string _name;
    std::shared_ptr<LkFutexPosix> _futex;
};

}  // namespace Orv
