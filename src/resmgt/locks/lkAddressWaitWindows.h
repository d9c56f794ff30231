#pragma once

#include "lkTimeLimit.h"

namespace Orv {

/// Sleeping on a 32-bit word until somebody announces a change of it.
///
/// A wake-up names only the address, so it may be given when the word is gone already; whoever
/// sleeps therefore tolerates wake-ups that were meant for an earlier owner of the memory.
class LkAddressWaitWindows {
public:
    /// Sleeps while the word at @p address equals @p expected. May return early: look again.
    static void wait(const void* address, unsigned expected, const LkTimeLimit& limit);
    static void wakeOne(const void* address) noexcept;
};

}  // namespace Orv
