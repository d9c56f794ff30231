#include "mbManager.h"

namespace Orv {

MbManager::~MbManager() = default;

bool MbManager::tryAllocateRegion(MbBufferImp*) {
    return false;
}

void MbManager::bufferCreated(MbBufferImp*) {}

void MbManager::bufferDestroyed(MbBufferImp*) {}

MbManagerStatistics MbManager::getStatistics() const {
    return {};
}

}  // namespace Orv
