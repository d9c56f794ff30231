#pragma once

#include "devANOQueueEntry.h"
#include "devMDStdFifoObs.h"
#include "mtContainer.h"
#include "resmgtApi.h"

namespace Orv {

/// Request queue of a device: bounded, first in first out; all work for the device goes through it
/// to the device's own thread.
///
/// - Threads: any number of producers and consumers. A full queue holds producers back; one that
///   would thereby wait for itself in a circle of devices goes past the capacity.
/// - Ownership: shared by all protocols and properties of a device. It is closed by the end of the
///   device thread; a queue that nobody closed must be empty when it goes, else it asserts.
/// - Errors: DevPrtclEx::ExMDStdFifoClosed in and after close(); the entry then stays with the
///   caller. RCEx::ExNullPtr for an empty entry.
class ORV_RESMGT_API DevMDStdFifo : public RCBase<LkCounter<long>> {
public:
    using Room = MtContainer<DevANOQueueEntry>::Room;
    using Result = MtContainer<DevANOQueueEntry>::Result;

    /// @param capacity  in requests; 0 and less: unbounded.
    explicit DevMDStdFifo(int capacity);
    DevMDStdFifo(const RCShdPtr<DevMDStdFifoObs>& observer, int capacity);
    ~DevMDStdFifo() noexcept(false) override;

    /// Appends the request, waiting for room.
    /// @return whether a consumer was woken that had slept for long: its answer takes a while.
    bool produce(DevANOQueueEntry& entry);
    bool produce(DevANOQueueEntry&& entry) { return produce(entry); }

    /// Appends it at once, whether there is room or not: for what must not wait.
    void producePastCapacity(DevANOQueueEntry& entry);

    /// Like produce(), but gives up at the limit.
    /// @return false if there was no room in time; the entry stays with the caller.
    [[nodiscard]] bool timedProduce(DevANOQueueEntry& entry, const LkTimeLimit& limit);

    DevANOQueueEntry consume();                ///< Takes the first request, waiting for one.
    bool tryConsume(DevANOQueueEntry& entry);  ///< False, and @p entry untouched, if empty.

    /// Refuses all further requests and destroys those inside, in order.
    void close();

    bool isClosed() const noexcept { return _container.isClosed(); }
    int getSize() const noexcept;  ///< Requests inside; a snapshot.
    bool hasRoom() const noexcept { return _container.hasRoom(); }

    /// Who empties the queue, for DevWaitGraph.
    DevWaitGraph::Target& getTarget() noexcept { return _container.getTarget(); }

private:
    MtContainer<DevANOQueueEntry> _container;

    Result enter(DevANOQueueEntry& entry, Room room, const LkTimeLimit& limit);
};

}  // namespace Orv
