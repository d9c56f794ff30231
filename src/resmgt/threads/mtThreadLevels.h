#pragma once

#include "resmgtApi.h"

namespace Orv {

/// The levels at which threads run, 0 to 6, and what they are to the operating system.
///
/// - Threads: any; there is no state.
class ORV_RESMGT_API MtThreadLevels {
public:
    static constexpr int NB_LEVELS = 7;
    static constexpr int NORMAL_LEVEL = 3;

    /// The scheduling class of a process; its value is where the class begins in the table of
    /// numbers.
    enum class ProcessClass {
        IDLE = 0,
        BELOW_NORMAL = 7,
        NORMAL = 14,
        ABOVE_NORMAL = 21,
        HIGH = 28,
        REAL_TIME = 35
    };

    MtThreadLevels() = delete;

    /// The thread priority of a level as Windows numbers it, -15 to 15.
    /// @throws ProgramAborted for any other level.
    static int toThreadPriority(int level);

    /// The level of such a priority; of one between two levels, the lower one.
    static int toLevel(int threadPriority) noexcept;

    /// The number from 1 to 31 that class and level come to, as Windows shows it.
    /// @throws ProgramAborted for any other class or level.
    static int toBasePriority(ProcessClass processClass, int level);

    static bool isLevel(int level) noexcept { return level >= 0 && level < NB_LEVELS; }
};

}  // namespace Orv
