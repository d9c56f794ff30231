#pragma once

#include <atomic>
#include <csignal>
#include <cstdint>
#include <pthread.h>

namespace Orv {

/// Ends a thread where it stands: a real-time signal, one that nobody had taken when this was first
/// asked, whose handler leaves the thread through the kernel.
///
/// Nothing of the thread runs afterwards, neither destructors nor those of its keys, and whoever
/// joins it goes on.
class MtStopSignalPosix {
public:
    /// What a thread blocks that this is to reach: every asynchronous signal but the one.
    static const sigset_t& getBlockedSignals();

    /// The order to end, given to one thread: 0 before it.
    using Order = std::atomic<std::uint32_t>;

    /// From now on the calling thread takes this order; null: none.
    static void receive(Order* order) noexcept;

    /// @return whether the thread has taken the order, on its way out, within a second. Else the
    ///   order is withdrawn.
    static bool send(pthread_t thread, Order& order);
};

}  // namespace Orv
