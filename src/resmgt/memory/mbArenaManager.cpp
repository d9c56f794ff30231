#include "mbArenaManager.h"

#include "assertions.h"
#include "mbBufferImp.h"
#include "mbEx.h"
#include "mbRegionUtilPrivate.h"

namespace Orv {

MbArenaManager::MbArenaManager(const LiString& name, ObjPtr<DaArenaPool> arenaPool,
                               ObjPtr<MbUnloadStrategy> strategy)
    : MbPoolManager(name, strategy), _arenaPool(arenaPool) {
    ORV_ASSERT_TEXT(!_arenaPool.isNull(), "arenaPool != null");
}

MbArenaManager::~MbArenaManager() = default;

bool MbArenaManager::performAllocate(MbBufferImp* buffer) {
    const std::uint64_t total = MbRegionUtil::getTotalBytes(*buffer);
    if (total > _arenaPool->getSize()) {
        throw MbEx::ExNotEnoughMemory(ORV_FILE, 68,
                                      "Buffer size larger then total arena pool size.");
    }
    // The total has room for the alignment, so the block may start anywhere.
    void* const block = _arenaPool->allocate(total, 0);
    if (block == nullptr) return false;
    MbRegionUtil::place(*buffer, block, total);
    return true;
}

void MbArenaManager::performDeallocate(MbBufferImp* buffer) {
    _arenaPool->deallocate(buffer->getRegion().blockStart);
    buffer->setRegion({});
}

}  // namespace Orv
