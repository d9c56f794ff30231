#pragma once

#include <pthread.h>

namespace Orv {

/// The processors that the process may use, numbered from 0. They are those of the moment when
/// somebody first asked: later the main thread, of which the system tells, may be placed.
class MtProcessorsPosix {
public:
    static int getNumber();

    /// Places a thread on one processor, or on any for a negative number.
    /// @throws SysAssertionFailed
    static void place(pthread_t thread, int number);
};

}  // namespace Orv
