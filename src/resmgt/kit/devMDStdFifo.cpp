#include "devMDStdFifo.h"

#include <algorithm>
#include <limits>

#include "devPrtclEx.h"
#include "rcExUtil.h"

namespace Orv {

namespace {

using Container = MtContainer<DevANOQueueEntry>;

/// Forwards what a device wants to hear.
class FifoObserver : public MtContainerObserver<DevANOQueueEntry> {
public:
    explicit FifoObserver(const RCShdPtr<DevMDStdFifoObs>& observer) : _observer(observer) {}

    void destroyed(Container&) override {}
    void produced(Container&, DevANOQueueEntry& entry) override { _observer->produced(entry); }
    void consumed(Container&, DevANOQueueEntry&) override {}

private:
    const RCShdPtr<DevMDStdFifoObs> _observer;
};

}  // namespace

DevMDStdFifoObs::~DevMDStdFifoObs() noexcept(false) = default;

DevMDStdFifo::DevMDStdFifo(int capacity) : _container("DevMDStdFifo", capacity) {}

DevMDStdFifo::DevMDStdFifo(const RCShdPtr<DevMDStdFifoObs>& observer, int capacity)
    : DevMDStdFifo(capacity) {
    if (!observer.isNull()) {
        _container.setObserver(
            RCShdPtr<MtContainerObserver<DevANOQueueEntry>>(new FifoObserver(observer)));
    }
}

DevMDStdFifo::~DevMDStdFifo() noexcept(false) = default;

DevMDStdFifo::Result DevMDStdFifo::enter(DevANOQueueEntry& entry, Room room,
                                         const LkTimeLimit& limit) {
    if (entry.isEmpty()) RCExUtil::throwExNullPtr();
    const Result result = _container.produce(entry, room, limit);
    if (result == Result::CLOSED) throw DevPrtclEx::ExMDStdFifoClosed(ORV_FILE, __LINE__);
    return result;
}

bool DevMDStdFifo::produce(DevANOQueueEntry& entry) {
    return enter(entry, Container::WAIT_FOR_ROOM, LkTimeLimit()) == Result::DONE_WAKING;
}

void DevMDStdFifo::producePastCapacity(DevANOQueueEntry& entry) {
    enter(entry, Container::PAST_CAPACITY, LkTimeLimit());
}

bool DevMDStdFifo::timedProduce(DevANOQueueEntry& entry, const LkTimeLimit& limit) {
    return enter(entry, Container::WAIT_FOR_ROOM, limit) != Result::TIMED_OUT;
}

DevANOQueueEntry DevMDStdFifo::consume() {
    DevANOQueueEntry entry;
    if (_container.consume(entry) == Container::Result::CLOSED) {
        throw DevPrtclEx::ExMDStdFifoClosed(ORV_FILE, __LINE__);
    }
    return entry;
}

bool DevMDStdFifo::tryConsume(DevANOQueueEntry& entry) {
    return _container.tryConsume(entry);
}

void DevMDStdFifo::close() {
    _container.close();
}

int DevMDStdFifo::getSize() const noexcept {
    return static_cast<int>(
        std::min<std::size_t>(_container.getSize(), std::numeric_limits<int>::max()));
}

}  // namespace Orv
