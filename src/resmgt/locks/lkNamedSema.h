#pragma once

#include <memory>

#include "lkSemaTypes.h"

namespace Orv {

/// Counting semaphore that processes share by name.
///
/// It lives exactly as long as some process has it open; a process that dies lets go of what it had
/// open, and what it took from the count stays taken. Every wait and post is a call of the system:
/// within one process use LkUnnamedSema or LkSema.
///
/// - Names: up to 259 bytes of UTF-8; slashes are part of the name and backslashes mean slashes.
///   Each user has names of his own.
/// - Threads: every member by any thread. The thread whose wait() has returned may destroy the
///   object at once, while post() has not returned yet.
/// - Errors: the constructor does not throw; ask isValid(). Operations on an invalid one assert.
class ORV_RESMGT_API LkNamedSema {
public:
    /// @param osName  null makes a semaphore that no other object shares.
    /// @param initialCount  at most 2147483647; counts only if the semaphore is created.
    /// @param name  for diagnostics, borrowed; null: @p osName, then borrowed as well.
    LkNamedSema(const char* osName, unsigned initialCount, LkSemaTypes::CreateFlag createFlag,
                const char* name = nullptr);
    ~LkNamedSema() noexcept(false);

    LkNamedSema(const LkNamedSema&) = delete;
    LkNamedSema& operator=(const LkNamedSema&) = delete;

    void post();  ///< Asserts if the count is 2147483647 already.
    void wait();  ///< Blocks, without limit, until it has taken one from the count.
    [[nodiscard]] bool tryWait();  ///< Takes one from the count if that is not 0.

    bool isValid() const noexcept;
    int getErrno() const noexcept;  ///< The system's code for why it is not valid, or 0.
    const char* getName() const noexcept { return _name; }

private:
    class Native;                     // LkNamedSemaPosix or LkNamedSemaWindows
    std::unique_ptr<Native> _native;  // never null
    const char* _name;
};

}  // namespace Orv
