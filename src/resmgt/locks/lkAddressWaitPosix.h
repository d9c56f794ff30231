#pragma once

#include "lkTimeLimit.h"

namespace Orv {

/// Sleeping on a 32-bit word until somebody announces a change of it: the futex calls.
///
/// A wake-up names only the address, so it may be given when the word is gone already; whoever
/// sleeps therefore tolerates wake-ups that were meant for an earlier owner of the memory.
class LkAddressWaitPosix {
public:
    enum class Scope { PROCESS, MACHINE };

    /// Sleeps while the word at @p address equals @p expected. May return early: look again.
    /// @return false if the time ran out.
    static bool wait(const void* address, unsigned expected, const LkTimeLimit& limit,
                     Scope scope = Scope::PROCESS);
    static void wakeOne(const void* address) noexcept;
    static void wakeAll(const void* address, Scope scope = Scope::PROCESS) noexcept;
};

}  // namespace Orv
