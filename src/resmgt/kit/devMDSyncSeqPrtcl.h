#pragma once

#include "devANO.h"
#include "devMDPrtcl.h"
#include "dtTime.h"
#include "dtTimeMark.h"

namespace Orv {

/// A device that takes part in synchronised sequences: it gets ready, gets into step at a given
/// time, and stops, all when it is told to. DevMDStdSyncSeqDevice is a base for ordinary ones.
///
/// Each operation is a request: it returns at once, and its completion object runs when the device
/// has done it. One that is destroyed unrun tells that the device has failed to; for stop and abort
/// it counts as done. The device may be told to stop at any time after it was ready, to abort at
/// any time, to recover also while it gets into step; the attempt's completion means nothing then.
///
/// - Threads: a sequence calls from the manager's thread, or from one that ends the sequence.
/// - Errors: DevPrtclEx::ExMDStdFifoClosed if the device is gone. What an operation throws is the
///   failure of the node.
class ORV_RESMGT_API DevMDSyncSeqPrtcl : public virtual DevMDPrtcl {
public:
    ~DevMDSyncSeqPrtcl() noexcept(false) override;

    /// Prepare. @p aco only tells that the request was taken.
    /// @param ready  to be performed when the device is ready; destroyed without that, it tells
    ///   that the device never will be.
    /// @param lockLost  to be performed whenever the device has fallen out of step.
    /// Both may be performed any number of times, by any thread, until the device drops them.
    virtual void performStart(ObjPtr<DevACO> aco, ObjPtr<DevANO> ready,
                              ObjPtr<DevANO> lockLost) = 0;

    virtual void performStop(ObjPtr<DevACO> aco) = 0;

    /// Get into step; done when the device is.
    /// @param time  a place on the line of time that the devices of the sequence share.
    virtual void performSync(ObjPtr<DevACO> aco, const DtTime& time) = 0;
    /// @param mark  a moment of the running clock.
    virtual void performSync(ObjPtr<DevACO> aco, const DtTimeMark& mark) = 0;

    virtual void performAbort(ObjPtr<DevACO> aco) = 0;

    /// Out of step: get ready again; done when the device is.
    virtual void performRecover(ObjPtr<DevACO> aco) = 0;
};

}  // namespace Orv
