#pragma once

#include <iosfwd>

#include "liString.h"
#include "lkCounter.h"
#include "mbManagerStatistics.h"
#include "rcBase.h"
#include "resmgtApi.h"

namespace Orv {

class MbBufferImp;

/// Where buffers get their memory from, and who decides which of them gives way when it runs short.
///
/// MbHeapManager takes memory from the heap, MbArenaManager from one large block. Derive from
/// MbPoolManager for other memory, from this class for other rules.
///
/// - Threads: every member by any thread; buffers call, most of them with their own mutex held. So
///   a manager never takes a buffer's mutex while it holds a lock of its own.
/// - Ownership: buffers share their manager; it lives as long as the last of them.
class ORV_RESMGT_API MbManager : public RCBase<LkCounter<long>> {
public:
    ~MbManager() override;

    virtual const LiString& getName() const = 0;

    /// Gives a buffer its memory, MbBufferImp::setRegion(); waits until there is some. The buffer's
    /// mutex is not held.
    /// @throws MbEx::ExNotEnoughMemory if there can never be enough, what unloading a buffer throws.
    virtual void allocateRegion(MbBufferImp* buffer) = 0;

    /// Takes a buffer's memory back and clears its region. Does not throw.
    virtual void deallocateRegion(MbBufferImp* buffer) = 0;

    /// The buffer is in use, or about to go: it cannot be unloaded.
    virtual void bufferNotUnloadable(MbBufferImp* buffer) = 0;

    /// The buffer is loaded and unlocked: from now on it may be told to unload.
    virtual void bufferUnloadable(MbBufferImp* buffer) = 0;

    virtual void dump(std::ostream&) const = 0;

    /// As allocateRegion(), but only if that needs neither waiting nor unloading. As it stands,
    /// never.
    [[nodiscard]] virtual bool tryAllocateRegion(MbBufferImp* buffer);

    /// A buffer begins, and ends, to use this manager. As they stand, nothing.
    virtual void bufferCreated(MbBufferImp* buffer);
    virtual void bufferDestroyed(MbBufferImp* buffer);

    /// As it stands, all zero.
    virtual MbManagerStatistics getStatistics() const;
};

}  // namespace Orv
