#pragma once

#include <atomic>
#include <chrono>
#include <cstdint>

#include "resmgtApi.h"

namespace Orv {

/// The policy of every wait: look at a word in memory for a short while, then sleep.
///
/// A partner that answers within microseconds is met while its waiter still looks, which saves both
/// of them the system calls of sleeping and waking. Each object keeps the experience of its own
/// waits: where looking has not paid off they sleep at once and only probe now and then, ever more
/// rarely; new objects start from the experience of the thread. Nobody looks on a thread that may
/// use only one processor, nor in the real-time class, where the partner could not run meanwhile.
///
/// - Threads: any number may look through one object; the experience is a hint, kept without locks.
/// - Cost: four bytes per object; a look takes LONGEST_LOOK at most.
class ORV_RESMGT_API LkAdaptiveWait {
public:
    static constexpr std::chrono::microseconds LONGEST_LOOK{20};

    /// Looks, if that promises to pay off, until @p isMet() or the look is over.
    /// @param isMet  reads memory only; it is called some hundred times.
    /// @return true once @p isMet() was true; on false the caller sleeps.
    template <class Condition>
    bool look(Condition isMet) {
        if (!isWorthLooking()) return false;
        for (Look look; look.goesOn();) {
            if (isMet()) {
                recordSuccess();
                return true;
            }
        }
        recordFailure();
        return false;
    }

    /// One bounded look, for loops that decide for themselves whether looking is worth while.
    class ORV_RESMGT_API Look {
    public:
        bool goesOn() noexcept;  ///< Pauses the processor; false when the look is over.

    private:
        std::chrono::steady_clock::time_point _start;
        std::uint32_t _nbRounds = 0;
    };

    /// May the calling thread look at all? Cached for each thread.
    static bool mayLook() noexcept;

    /// Makes every thread ask again. For whoever changes a thread's processors or class.
    static void forgetPlacement() noexcept;

private:
    /// What looking has brought. Not exact where threads meet, and need not be.
    struct Experience {
        std::atomic<std::uint8_t> score{0};       // 0: sleep at once
        std::atomic<std::uint8_t> probeShift{0};  // probe after 2^this waits without a look
        std::atomic<std::uint16_t> nbSkipped{0};  // since the last look

        bool isWorthLooking() noexcept;
        void add(bool hasPaidOff) noexcept;
    };

    static constexpr std::uint8_t UNKNOWN = 0xFF;

    Experience _experience{UNKNOWN, 0, 0};

    static Experience& ofThread() noexcept;
    static bool canCurrentThreadGain() noexcept;  // asks the system

    bool isWorthLooking() noexcept;
    void recordSuccess() noexcept { record(true); }
    void recordFailure() noexcept;
    void record(bool hasPaidOff) noexcept;
};

}  // namespace Orv
