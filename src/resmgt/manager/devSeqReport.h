#pragma once

#include "lkCounter.h"
#include "rcBase.h"
#include "resmgtApi.h"

namespace Orv {

/// What a device of a sequence tells: that it has done what it was told to, or failed to, or that
/// something has happened to it.
struct DevSeqReport {
    enum Kind : unsigned char { STARTED, READY, LOCKED, LOCK_LOST, RECOVERED, STOPPED, ABORTED };
    static constexpr int NB_KINDS = ABORTED + 1;

    unsigned node = 0;     ///< Which node's device.
    unsigned attempt = 0;  ///< Which command of its kind this answers, counted from 1.
    Kind kind = STARTED;
    bool isDone = true;  ///< False: nobody can do it any more.
};

/// Who hears the reports.
class ORV_RESMGT_API DevSeqReportTarget : public RCBase<LkCounter<long>> {
public:
    ~DevSeqReportTarget() noexcept(false) override;

    virtual void take(const DevSeqReport& report) noexcept = 0;  ///< On the manager's thread.

    /// Is anybody still interested? Any thread.
    virtual bool isOpen() const noexcept = 0;

    /// A report did not get through, as the manager's thread has died. Any thread.
    virtual void miss() noexcept = 0;
};

}  // namespace Orv
