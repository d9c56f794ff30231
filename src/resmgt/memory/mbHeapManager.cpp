#include "mbHeapManager.h"

#include <new>

#include "hmHeapMgr.h"
#include "mbBufferImp.h"
#include "mbEx.h"
#include "mbRegionUtilPrivate.h"
#include "sourceFile.h"

namespace Orv {

MbHeapManager::MbHeapManager(const LiString& name, std::uint64_t maxBytes,
                             ObjPtr<MbUnloadStrategy> strategy)
    : MbPoolManager(name, strategy), _maxBytes(maxBytes) {}

MbHeapManager::~MbHeapManager() = default;

bool MbHeapManager::performAllocate(MbBufferImp* buffer) {
    const std::uint64_t total = MbRegionUtil::getTotalBytes(*buffer);
    if (total > _maxBytes) {
        throw MbEx::ExNotEnoughMemory(ORV_FILE, 63,
                                      "Buffer size larger then maximum allocated bytes.");
    }
    if (total > _maxBytes - getBytesInUse()) return false;
    try {
        MbRegionUtil::place(*buffer, HmHeapMgr::allocate(total), total);
    } catch (const std::bad_alloc&) {
        throw MbEx::ExNotEnoughMemory(ORV_FILE, 84, "Unable to allocate memory.");
    }
    return true;
}

void MbHeapManager::performDeallocate(MbBufferImp* buffer) {
    HmHeapMgr::release(buffer->getRegion().blockStart);
    buffer->setRegion({});
}

}  // namespace Orv
