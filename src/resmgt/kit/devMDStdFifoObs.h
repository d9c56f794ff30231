#pragma once

#include "devANOQueueEntry.h"
#include "rcBase.h"
#include "resmgtApi.h"

namespace Orv {

/// Hears of every request that was put into a DevMDStdFifo, on the thread that did it and without a
/// lock of the queue: for a device that does not wait at the queue but is woken another way.
class ORV_RESMGT_API DevMDStdFifoObs : public RCBase<LkCounter<long>> {
public:
    ~DevMDStdFifoObs() noexcept(false) override;

    /// @param entry  the producer's, which the queue has emptied; it may be consumed by now.
    virtual void produced(DevANOQueueEntry& entry) = 0;
};

}  // namespace Orv
