#include "devMgrFifo.h"

#include "devMgrEx.h"
#include "rcExUtil.h"

namespace Orv {

using Container = MtContainer<DevANOQueueEntry>;

DevMgrFifo::DevMgrFifo(int capacity) : _container("DevMgrFifo", capacity) {}

DevMgrFifo::~DevMgrFifo() noexcept(false) = default;

void DevMgrFifo::produce(DevANOQueueEntry& entry) {
    if (entry.isEmpty()) RCExUtil::throwExNullPtr();
    if (_container.produce(entry) != Container::Result::CLOSED) return;
    if (_hasDied.load()) throw DevMgrEx::ThreadEnded(ORV_FILE, __LINE__);
    entry = DevANOQueueEntry();
}

DevANOQueueEntry DevMgrFifo::consume() {
    DevANOQueueEntry entry;
    static_cast<void>(_container.consume(entry));
    return entry;
}

void DevMgrFifo::close(bool hasDied) {
    if (hasDied) _hasDied = true;
    _container.close();
}

}  // namespace Orv
