#pragma once

#include "lkSemaTypes.h"
#include "lkWaitQueue.h"

namespace Orv {

/// Counting semaphore of one process: hands over items or permissions one by one.
///
/// Waiters are served in the order they came. It needs no object of the system, so it may lie on
/// the stack of a thread that waits for one answer. Across processes use LkNamedSema, for a lasting
/// state LkEvent.
///
/// - Threads: every member by any thread; the thread whose wait() has returned may destroy it at
///   once, while post() has not returned yet.
/// - Memory: what was written before post() is visible to the thread whose wait it ends.
/// - Errors: an initial count above 2147483647 leaves an invalid semaphore, on which every
///   operation asserts.
class ORV_RESMGT_API LkUnnamedSema {
public:
    /// @param name  for diagnostics; borrowed, must outlive the semaphore.
    LkUnnamedSema(const char* name, unsigned initialCount,
                  LkSemaTypes::Shared = LkSemaTypes::PROCESS_PRIVATE) noexcept;

    void post();  ///< Asserts if the count is 2147483647 already.
    void wait();  ///< Blocks, without limit, until it has taken one from the count.

    /// Like wait(), but sleeps at once: for a partner that sleeps itself and had to be woken. It then
    /// finds this processor free, which is quicker than to wake another one.
    void waitAsleep();

    [[nodiscard]] bool tryWait();  ///< Takes one from the count if that is not 0.

    bool isValid() const noexcept { return _errno == 0; }
    int getErrno() const noexcept { return _errno; }  ///< The system's code; 0 if valid.
    const char* getName() const noexcept { return _name; }

private:
    LkWaitQueue _queue;
    const char* _name;
    int _errno;
};

}  // namespace Orv
