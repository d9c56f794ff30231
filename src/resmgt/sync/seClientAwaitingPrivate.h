#pragma once

#include "seClientThread.h"

namespace Orv {

/// The calling thread waits for the end of a client. Where it is a client itself, this is noted, so
/// that no circle of clients comes about that wait for one another.
///
/// - Threads: made and destroyed by the one that waits.
class SeClientAwaiting {
public:
    /// Asserts that @p awaited is not the calling client and does not wait for it, directly or
    /// through others: "!isAwaited".
    explicit SeClientAwaiting(SeClientThread& awaited);
    ~SeClientAwaiting();

    SeClientAwaiting(const SeClientAwaiting&) = delete;
    SeClientAwaiting& operator=(const SeClientAwaiting&) = delete;

private:
    SeClientThread* const _self;  // null on other threads
};

}  // namespace Orv
