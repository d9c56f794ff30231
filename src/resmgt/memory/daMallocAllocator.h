#pragma once

#include "daArenaAllocator.h"
#include "objPtr.h"

namespace Orv {

/// Blocks from the C heap, malloc() and free(); aligned for every ordinary type.
///
/// - Threads: every member may be called by any thread.
class ORV_RESMGT_API DaMallocAllocator : public DaArenaAllocator {
public:
    static ObjPtrRet<DaMallocAllocator> create();

    [[nodiscard]] void* allocate(std::uint64_t size) override;
    void deallocate(void* block, std::uint64_t size) override;  ///< @p size does not matter.

private:
    DaMallocAllocator() = default;
};

}  // namespace Orv
