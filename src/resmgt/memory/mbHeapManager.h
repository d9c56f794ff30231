#pragma once

#include <cstdint>

#include "mbPoolManager.h"

namespace Orv {

/// A pool that takes each buffer's memory from the heap, up to a limit. Take it where buffers are of
/// similar size or live long; MbArenaManager cuts one block into pieces instead.
class ORV_RESMGT_API MbHeapManager : public MbPoolManager {
public:
    /// @param maxBytes  of all loaded buffers, with what their alignments may need on top.
    MbHeapManager(const LiString& name, std::uint64_t maxBytes, ObjPtr<MbUnloadStrategy> strategy);
    ~MbHeapManager() override;

    std::uint64_t getMaxBytes() const noexcept { return _maxBytes; }

private:
    const std::uint64_t _maxBytes;

    bool performAllocate(MbBufferImp* buffer) override;
    void performDeallocate(MbBufferImp* buffer) override;
};

}  // namespace Orv
