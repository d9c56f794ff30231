#pragma once

#include <atomic>
#include <cstdint>

#include "lkMutex.h"
#include "lkPulse.h"

namespace Orv {

/// Turnstile: threads go on in the order of the numbers they hold.
///
/// Who is to go when is for the application to say, by handing out numbers. LkTicketGuard waits for
/// a turn and passes it on.
///
/// - Threads: every member by any thread; whoever waited last may destroy it at once.
/// - Memory: what was written before next() is visible to the threads that it lets go on.
class ORV_RESMGT_API LkTicket {
public:
    /// @param name  borrowed, must outlive the object.
    explicit LkTicket(const char* name) : _mutex(name), _pulse(name, LkPulse::WAKE_ALL) {}

    /// The number whose turn it is; starts at 0 and only grows.
    std::int64_t getTicket() const noexcept { return _ticket.load(std::memory_order_acquire); }

    void next();  ///< The turn of the next number.

    /// Returns when it is the turn of @p ticket, or has been, if turns went on meanwhile. A number
    /// whose turn was over before the call asserts "ticket >= _ticket".
    /// @return whether it had to wait.
    bool waitForTicket(std::int64_t ticket);

private:
    std::atomic<std::int64_t> _ticket{0};  // changes with the mutex held
    LkMutex _mutex;
    LkPulse _pulse;
};

}  // namespace Orv
