#pragma once

#include <atomic>

#include "devANOQueueEntry.h"
#include "mtContainer.h"
#include "resmgtApi.h"

namespace Orv {

/// Notifications of one manager, on their way to its thread: bounded, so that devices which post
/// faster than observers listen are held back.
///
/// - Threads: any produce, the manager's thread consumes.
/// - Errors: RCEx::ExNullPtr for an empty entry. When the manager is closed, notifications are
///   destroyed unseen; when its thread has died, DevMgrEx::ThreadEnded.
class ORV_RESMGT_API DevMgrFifo : public RCBase<LkCounter<long>> {
public:
    explicit DevMgrFifo(int capacity);
    ~DevMgrFifo() noexcept(false) override;

    void produce(DevANOQueueEntry& entry);  ///< Waits for room.
    void produce(DevANOQueueEntry&& entry) { produce(entry); }

    DevANOQueueEntry consume();  ///< Waits for a notification; empty if the queue was closed.

    /// Ends all waits and destroys what is inside.
    /// @param hasDied  by an exception on the manager's thread.
    void close(bool hasDied);

    bool isClosed() const noexcept { return _container.isClosed(); }
    int getSize() const noexcept { return static_cast<int>(_container.getSize()); }
    DevWaitGraph::Target& getTarget() noexcept { return _container.getTarget(); }

private:
    std::atomic<bool> _hasDied{false};
    MtContainer<DevANOQueueEntry> _container;
};

}  // namespace Orv
