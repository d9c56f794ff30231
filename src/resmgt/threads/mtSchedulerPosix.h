#pragma once

#include <sys/types.h>

namespace Orv {

/// How levels and classes of threads are put to the kernel, which keeps both per thread.
///
/// In the normal class a level is a nice value, level 3 being the one the process started with; in
/// the real-time class it is a round-robin priority, the number that the level has there on Windows.
/// What a forked process inherits is the normal class.
class MtSchedulerPosix {
public:
    /// A thread's class and value, from the best to the worst: round-robin priorities, then nice
    /// values.
    struct State {
        bool isRealTime = false;
        int value = 0;

        bool operator==(const State&) const = default;
    };

    static State read(pid_t thread);  ///< @throws SysAssertionFailed

    /// @param current  as it was read, or as this has returned it before.
    /// @return what the thread has now: the level's own state unless rights are missing. A thread
    ///   that may not have its round-robin priority gets the highest it may have.
    /// @throws SysAssertionFailed
    static State apply(pid_t thread, int level, bool isRealTime, const State& current);

    /// The level whose state comes nearest.
    static int toLevel(const State& state);
    static State toState(int level, bool isRealTime);

    static int getStartNice() noexcept;  ///< Of the process, when this was first asked.

    /// Whether the calling thread may enter the real-time class, found by doing so for a moment.
    /// @return 0, or the system's error.
    static int probeRealTime() noexcept;
};

}  // namespace Orv
