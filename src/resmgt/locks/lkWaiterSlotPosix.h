#pragma once

namespace Orv {

class LkWaiter;

/// Each thread's own waiter; who gave it is told when the thread ends.
class LkWaiterSlotPosix {
public:
    using GiveBack = void (*)(LkWaiter& waiter);

    /// Null if the thread has none: before set(), and after its end was noticed.
    static LkWaiter* get() noexcept;

    /// Keeps @p waiter for the thread until it ends.
    /// @return false if its end was noticed already, so that nobody would be told.
    static bool set(LkWaiter& waiter, GiveBack giveBack);
};

}  // namespace Orv
