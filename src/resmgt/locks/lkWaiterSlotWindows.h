#pragma once

namespace Orv {

class LkWaiter;

/// Each thread's own waiter; who gave it is told when the thread ends.
///
/// The compiler's own thread-local variables will not do: here their memory may go before the
/// thread's last destructors run, and comes back empty when one of these touches it.
class LkWaiterSlotWindows {
public:
    using GiveBack = void (*)(LkWaiter& waiter);

    /// Null if the thread has none: before set(), and after its end was noticed.
    static LkWaiter* get() noexcept;

    /// Keeps @p waiter for the thread until it ends.
    /// @return false if its end was noticed already, so that nobody would be told.
    static bool set(LkWaiter& waiter, GiveBack giveBack);
};

}  // namespace Orv
