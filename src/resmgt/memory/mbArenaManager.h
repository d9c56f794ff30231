#pragma once

#include "daArenaPool.h"
#include "mbPoolManager.h"

namespace Orv {

/// A pool that cuts the memory of its buffers out of one large block: buffers of mixed sizes, memory
/// that a device or another process sees, huge pages, a footprint that is fixed from the start.
///
/// What is free lies in pieces between buffers, so more is unloaded than the sizes alone would need.
class ORV_RESMGT_API MbArenaManager : public MbPoolManager {
public:
    /// @param arenaPool  not null.
    MbArenaManager(const LiString& name, ObjPtr<DaArenaPool> arenaPool,
                   ObjPtr<MbUnloadStrategy> strategy);
    ~MbArenaManager() override;

    std::uint64_t getMaxBytes() const noexcept { return _arenaPool->getSize(); }

private:
    const ObjPtr<DaArenaPool> _arenaPool;

    bool performAllocate(MbBufferImp* buffer) override;
    void performDeallocate(MbBufferImp* buffer) override;
};

}  // namespace Orv
