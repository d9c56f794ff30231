#pragma once

#include "objPtr.h"
#include "periodicTimer.h"
#include "seSourceProtocol.h"

namespace Orv {

/// Ticks at a steady rate by the monotonic clock: each tick is due a whole number of intervals
/// after the start, so the rate does not drift, whatever clients and machine do meanwhile. Ticks
/// that the machine was too late for are counted.
///
/// The process has one, for which most need no other; make further ones for further rates.
///
/// - Threads: as SeSourceProtocol; setInterval() and getInterval() by any thread.
class ORV_RESMGT_API SeSourceClock : public SeSourceProtocol {
public:
    static constexpr double DEFAULT_SECONDS = 0.01;

    /// The clock "SeSourceClock" of the process, at first of DEFAULT_SECONDS.
    static SeSourceClock& getInstance();

    /// @param intervalSeconds  finite and at least PeriodicTimer::SHORTEST_SECONDS, else an
    ///   assertion.
    SeSourceClock(const LiString& name, double intervalSeconds);

    /// Takes effect at once: the next tick is due one new interval after the last one that was.
    /// @return the interval before, in seconds.
    double setInterval(double seconds);
    double getInterval() const { return _timer.getInterval(); }  ///< In seconds.

    /// Ticks since the start that were counted, but came so late that the next was due already.
    std::uint64_t getNbLateTicks() const { return _timer.getNbLateTicks(); }

    static ObjPtrRet<SeSourceClock> createInstance();  ///< For LkSingleton.

protected:
    void start() override;
    std::uint32_t waitForTick() override;
    void stop() override;
    void cancelWait() override;

private:
    PeriodicTimer _timer;
};

}  // namespace Orv
