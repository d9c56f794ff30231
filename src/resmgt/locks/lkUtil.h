#pragma once

#include "resmgtApi.h"

namespace Orv {

/// Yielding between locks, a means against unfair scheduling: off unless the environment variable
/// `ORV_LOCK_YIELD` is a number other than 0.
///
/// - Threads: every member may be called by any thread.
class ORV_RESMGT_API LkUtil {
public:
    /// Gives up the rest of the time slice if yielding is enabled; else returns at once.
    static void yield() noexcept;

    static void enableYield();   ///< Sets the environment variable to 1, with effect at once.
    static void disableYield();  ///< Sets the environment variable to 0, with effect at once.
    static bool isYieldEnabled() noexcept;

    static int getMinSchedulingPriority() noexcept { return 0; }
};

}  // namespace Orv
