#pragma once

#include <exception>

#include "lkMutex.h"
#include "lkPulse.h"
#include "seSourceProtocol.h"

namespace Orv {

/// Ticks when it is told to: by the callback of a device (a frame has arrived), or by a test.
///
/// Steps count from construction. Those that come while nothing waits are not lost: the next wait
/// ends at once with their sum, also where they came before the engine was given the source.
///
/// - Threads: as SeSourceProtocol; step() and fail() by any thread, also from a beat. They do not
///   wait for clients; for that see SeSyncEngine::waitTickDone().
class ORV_RESMGT_API SeSourceStepped : public SeSourceProtocol {
public:
    explicit SeSourceStepped(const LiString& name);

    /// Ticks once, or makes up for ticks that the device knows to have been lost.
    /// @param nbTicks  at least 1, else an assertion.
    /// @return the tick that it is now; never 0.
    std::uint32_t step(std::uint32_t nbTicks = 1);

    /// The device has failed or gone, and no tick will come: the generator's wait throws @p error,
    /// now or when it next starts. Without this, stopping a generator whose first tick never comes
    /// waits for it.
    void fail(std::exception_ptr error);

    std::uint32_t getTick() const;  ///< The sum of all steps.

protected:
    void start() override;
    std::uint32_t waitForTick() override;
    void stop() override;
    void cancelWait() override;

private:
    const LkMutex _lock{"SeSourceStepped"};
    LkPulse _pulse{"SeSourceStepped", LkPulse::WAKE_ALL};
    std::uint32_t _tick ORV_GUARDED_BY(_lock) = 0;
    std::uint32_t _toldTick ORV_GUARDED_BY(_lock) = 0;
    bool _isCancelled ORV_GUARDED_BY(_lock) = false;
    std::exception_ptr _error ORV_GUARDED_BY(_lock);  // until it is thrown
};

}  // namespace Orv
