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

    /// Names the calling thread: only a signal for this word ends it. Null: none does.
    static void receive(std::atomic<std::uint32_t>* isEnded) noexcept;

    /// @return whether the thread has set the word, on its way out, within a second.
    static bool send(pthread_t thread, std::atomic<std::uint32_t>& isEnded);
};

}  // namespace Orv
