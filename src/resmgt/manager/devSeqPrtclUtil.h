#pragma once

#include "devMDSyncSeqPrtcl.h"
#include "devMgrFifo.h"
#include "devSeqReport.h"
#include "lkLock.h"

namespace Orv {

/// Commands one device of a sequence, and has its answers delivered on the manager's thread, each
/// as one report.
///
/// - Threads: commands by one thread at a time; getLatency() and getMark() by any.
/// - Errors: a command throws what the device's protocol throws.
/// - The device may answer late, or when this object has gone: then its answers fall.
class ORV_RESMGT_API DevSeqPrtclUtil {
public:
    /// @param node  what the reports say of whose device they tell.
    DevSeqPrtclUtil(RCShdPtr<DevMDSyncSeqPrtcl> prtcl, RCShdPtr<DevMgrFifo> fifo,
                    RCShdPtr<DevSeqReportTarget> target, unsigned node);
    ~DevSeqPrtclUtil();

    DevSeqPrtclUtil(const DevSeqPrtclUtil&) = delete;
    DevSeqPrtclUtil& operator=(const DevSeqPrtclUtil&) = delete;

    void start();
    void stop();
    void abort();
    void recover();
    void sync(const DtTime& time);
    void sync(const DtTimeMark& mark);

    /// Does the report answer the last command of its kind?
    bool isLatest(const DevSeqReport& report) const {
        return report.attempt == _attempts[report.kind];
    }

    /// From the last sync() until the device was in step; zero before.
    DtTime getLatency() const;
    /// The moment when that was; zero before.
    DtTimeMark getMark() const;

    const DevMDSyncSeqPrtcl& getPrtcl() const { return *_prtcl; }

private:
    class Line;
    class CommandACO;
    class ReadyANO;
    class LockLostANO;
    class ReportANO;

    const RCShdPtr<DevMDSyncSeqPrtcl> _prtcl;
    const RCShdPtr<Line> _line;  // shared with what the device holds
    unsigned _attempts[DevSeqReport::NB_KINDS] = {};

    ObjPtr<DevACO> createACO(DevSeqReport::Kind kind);
};

}  // namespace Orv
