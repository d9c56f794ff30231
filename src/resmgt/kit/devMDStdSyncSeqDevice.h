#pragma once

#include "devMDStdDevice.h"
#include "devMDStdSyncSeqPrtcl.h"
#include "devMDSyncSeqRequest.h"

namespace Orv {

/// Base of an ordinary device that takes part in synchronised sequences. Override what it has to
/// do; all functions run on the device's own thread, one after the other.
///
/// Each of them is done when it returns, failed when it throws. One that takes long postpones its
/// request, lest an abort has to wait behind it.
///
/// - stop() comes at any time after the device was ready, abort() at any time after start(),
///   recover() also while a sync is postponed. What is postponed by then may be dropped.
class ORV_RESMGT_API DevMDStdSyncSeqDevice : public DevMDStdDevice, public DevMDStdSyncSeqPrtcl {
public:
    explicit DevMDStdSyncSeqDevice(const LiString& name, int capacity = STANDARD_CAPACITY);
    ~DevMDStdSyncSeqDevice() noexcept(false) override;

    void performClose() override;

protected:
    /// Prepare, and say signals.ready() then or later; keep the signals for lockLost(). By default
    /// ready at once.
    virtual void start(const DevMDSyncSeqSignals& signals);

    /// Get into step at a place on the sequence's line of time; done when it is. By default at once.
    virtual void syncTo(const DtTime& time, DevMDSyncSeqRequest& request);
    /// The same at a moment of the running clock.
    virtual void syncAt(const DtTimeMark& mark, DevMDSyncSeqRequest& request);

    virtual void recover(DevMDSyncSeqRequest& request);  ///< Get ready again.
    virtual void stop(DevMDSyncSeqRequest& request);
    virtual void abort(DevMDSyncSeqRequest& request);

    /// For stop(): what is still on its way into the sinks of addSink() comes first; done when none
    /// of them is open, after inputsEnded().
    void stopWhenInputsEnd(DevMDSyncSeqRequest& request);

private:
    class Factory;

    DevMDSyncSeqDone _stopping;  // of the device's thread

    void noteInputsEnded() override;
};

}  // namespace Orv
