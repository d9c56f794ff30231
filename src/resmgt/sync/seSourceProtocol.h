#pragma once

#include <atomic>
#include <cstdint>

#include "liString.h"
#include "resmgtApi.h"

namespace Orv {

/// Where ticks come from: a clock, or a device that an application is paced by.
///
/// For a rate take SeSourceClock; where something else in the program knows of each tick (a frame
/// has arrived), SeSourceStepped. Derive a class to wait for ticks in a device's own way.
///
/// - Threads: start(), waitForTick() and stop() are called by one thread, that of the source's
///   generator, without a lock; cancelWait() by any.
/// - Ownership: borrowed by the engine that it was given to until SeSyncEngine::stop() has
///   returned; by one engine at a time, else its use asserts "!_source.isInUse()".
/// - Errors: what start() and waitForTick() throw stops the generator and its clients and is told
///   by SeSyncEngine. What the others throw is traced.
class ORV_RESMGT_API SeSourceProtocol {
public:
    virtual ~SeSourceProtocol() noexcept(false) = default;  // a member may assert in its own
    SeSourceProtocol(const SeSourceProtocol&) = delete;
    SeSourceProtocol& operator=(const SeSourceProtocol&) = delete;

    /// Begins to tick. Comes again after stop().
    virtual void start() = 0;

    /// Blocks until there is a tick that was not told yet.
    /// @return how many ticks there were, counted from anywhere and past 2^32 to 0; the first one
    ///   after start() is not 0. After cancelWait() anything.
    virtual std::uint32_t waitForTick() = 0;

    /// Comes once after each start() that has not thrown.
    virtual void stop() = 0;

    /// Ends the wait under way and those to come until the next start(), so that stopping need not
    /// wait for a tick that may be far away or never come. May be called when not started, and
    /// twice.
    virtual void cancelWait() = 0;

    const LiString& getName() const noexcept { return _name; }  ///< Also of its generator's thread.
    bool isInUse() const noexcept { return _isInUse.load(std::memory_order_acquire); }

protected:
    explicit SeSourceProtocol(const LiString& name) : _name(name) {}

private:
    friend class SeGeneratorThread;

    const LiString _name;
    std::atomic<bool> _isInUse{false};
};

}  // namespace Orv
