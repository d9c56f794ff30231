#pragma once

#include <atomic>
#include <cstdint>
#include <memory>

#include "lkGuard.h"
#include "lkLock.h"
#include "lkMutex.h"
#include "lkPulse.h"
#include "mbManager.h"
#include "mbUnloadStrategy.h"
#include "objPtr.h"

namespace Orv {

class MbUnloadNotes;

/// Gives buffers memory as long as there is some, and unloads others when it runs short. A derived
/// class says where memory comes from.
///
/// Who needs room has buffers unloaded that are loaded and unlocked, one after the other as the
/// strategy selects them, on its own thread; if there are none it waits, without limit, until
/// somebody unlocks, frees or destroys one. So threads that each hold locks and want more may wait
/// for one another: budget for what is locked at a time.
///
/// - Threads: every member by any thread. No lock of the pool is held while a buffer is unloaded or
///   destroyed. Locking and unlocking loaded buffers takes none at all.
class ORV_RESMGT_API MbPoolManager : public MbManager {
public:
    /// @param strategy  not null.
    MbPoolManager(const LiString& name, ObjPtr<MbUnloadStrategy> strategy);
    ~MbPoolManager() override;

    const LiString& getName() const override { return _name; }
    void allocateRegion(MbBufferImp* buffer) override;
    [[nodiscard]] bool tryAllocateRegion(MbBufferImp* buffer) override;
    void deallocateRegion(MbBufferImp* buffer) override;
    void bufferNotUnloadable(MbBufferImp* buffer) override;
    void bufferUnloadable(MbBufferImp* buffer) override;
    void bufferCreated(MbBufferImp* buffer) override;
    void bufferDestroyed(MbBufferImp* buffer) override;

    /// Looks at every buffer, with the others kept from being created and destroyed meanwhile.
    MbManagerStatistics getStatistics() const override;

    void dump(std::ostream&) const override;

protected:
    /// Bytes of blocks that are handed out.
    std::uint64_t getBytesInUse() const noexcept {
        return _bytesInUse.load(std::memory_order_relaxed);
    }

private:
    using Guard = LkGuard<const LkMutex>;

    const LiString _name;
    LkMutex _mutex;
    LkPulse _pulse;  // wakes all who wait for room
    // Guarded by _mutex:
    ObjPtr<MbUnloadStrategy> _strategy;
    std::unique_ptr<MbUnloadNotes> _notes;
    std::uint64_t _nbRegions = 0;

    std::atomic<std::uint64_t> _bytesInUse{0};  // written under _mutex
    std::atomic<std::uint32_t> _nbSeeking{0};   // threads that have found too little room
    std::atomic<std::uint32_t> _nbWaiting{0};   // those of them that wait

    LkLock _listLock;
    // Guarded by _listLock:
    MbBufferImp* _firstBuffer = nullptr;
    std::uint64_t _nbBuffers = 0;
    MbBufferStatistics _countsOfGone;

    /// Fills the buffer's region. Called with the pool's mutex held, as the next.
    /// @return false if there is not enough room now.
    /// @throws MbEx::ExNotEnoughMemory if there never will be.
    virtual bool performAllocate(MbBufferImp* buffer) = 0;

    /// Gives the block of the buffer's region back and clears the region. Does not throw.
    virtual void performDeallocate(MbBufferImp* buffer) = 0;

    bool allocateNow(MbBufferImp* buffer);
    void makeRoom(Guard& guard);
    void evict(MbBufferImp& victim, Guard& guard);
    void waitForRoom(Guard& guard);
};

}  // namespace Orv
