#pragma once

#include <iosfwd>

#include "resmgtApi.h"

namespace Orv {

class MbBufferImp;

/// Which buffer gives way when a pool needs room: MbUnloadLRU, MbUnloadRandom or your own.
///
/// A strategy knows the buffers that are loaded and unlocked. Its pool tells it what has changed, in
/// the order in which it happened, when it is about to ask it: a buffer that was used meanwhile is
/// removed and inserted again.
///
/// - Threads: none of its own; the pool's lock is held. So it must not use what the buffers can do:
///   to a strategy they are keys.
/// - Ownership: a pool owns its strategy and belongs to one alone.
class ORV_RESMGT_API MbUnloadStrategy {
public:
    virtual ~MbUnloadStrategy();

    MbUnloadStrategy(const MbUnloadStrategy&) = delete;
    MbUnloadStrategy& operator=(const MbUnloadStrategy&) = delete;

    virtual const char* getName() const = 0;

    /// A buffer that is not in yet (else an assertion) has become unloadable. If it throws, the
    /// strategy is unchanged.
    virtual void insertBuffer(MbBufferImp* buffer) = 0;

    /// A buffer that is in (else an assertion) is so no more. Throws nothing else.
    virtual void removeBuffer(MbBufferImp* buffer) = 0;

    /// The buffer that gives way next; it stays in until it is removed.
    /// @return null if there is none.
    virtual MbBufferImp* selectVictim() const = 0;

    virtual bool isEmpty() const = 0;
    virtual void dump(std::ostream&) const = 0;

protected:
    MbUnloadStrategy() = default;
};

}  // namespace Orv
