#pragma once

#include <atomic>
#include <cstdint>
#include <string>

#include "lkSemaTypes.h"

namespace Orv {

/// Named semaphore over a shared word in a file, one file for each name.
///
/// Whoever has the semaphore open holds a shared lock of its file, which the kernel drops for a
/// process that dies. Opening and closing decide under the exclusive lock of the folder whether
/// anybody else still has it open; a file that nobody has open is a left-over and counts as none.
class LkNamedSemaPosix {
public:
    LkNamedSemaPosix(const char* osName, unsigned initialCount, LkSemaTypes::CreateFlag createFlag);
    ~LkNamedSemaPosix() { close(); }
    LkNamedSemaPosix(const LkNamedSemaPosix&) = delete;
    LkNamedSemaPosix& operator=(const LkNamedSemaPosix&) = delete;

    void post();
    void wait();
    bool tryWait() noexcept;

    int getErrno() const noexcept { return _errno; }
    int close() noexcept;  ///< Once; later calls do nothing. @return the system's error, or 0.

private:
    using Word = std::atomic<std::uint32_t>;

    Word _ownWord{0};  // of a semaphore without name
    Word* _word = nullptr;
    int _file = -1;
    std::string _path;  // in the folder
    int _errno = 0;

    int open(const char* osName, unsigned initialCount, LkSemaTypes::CreateFlag createFlag);
    int openFile(int folder, LkSemaTypes::CreateFlag createFlag, bool& isNew) noexcept;
};

}  // namespace Orv
