#pragma once

#include "baseApi.h"

namespace Orv {

class DtTimeMark;

/// Puts the calling thread to sleep, by a clock that never jumps.
///
/// For steady pacing take PeriodicTimer; to wait for something that happens, a lock or an event:
/// a sleep stands in for neither.
///
/// - Threads: every member may be called by any thread, which then sleeps. A signal that is
///   handled meanwhile neither ends nor lengthens the sleep.
class ORV_BASE_API Sleeper {
public:
    /// Sleeps for at least @p seconds. Zero, negative seconds and NaN are a yield(); more than the
    /// clock can count sleeps as long as it can.
    static void sleep(double seconds);

    /// Sleeps until @p deadline has come; at once, without giving up the time slice, if it has.
    static void sleepUntil(const DtTimeMark& deadline);

    /// The sleep of zero length: gives the rest of the time slice to another thread that is ready.
    static void yield() noexcept;
};

}  // namespace Orv
